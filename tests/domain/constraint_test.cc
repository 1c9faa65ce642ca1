// Contradictions among capability parameters keep a whole domain out, and nothing else.
#include "tests/domain/domain_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kContradiction[] =
    "-p net_bind_service 80 grant\n-s openat grant\n-p net_bind_service 80 revoke\n";

class ConstraintTest : public DomainTest {};

TEST_F(ConstraintTest, TheWholeListOfEveryDomainIsCheckedBeforeAnythingIsSet) {
  Domain("aDom", "-p net_bind_service 80 grant\n-p net_bind_service 443 revoke\n");
  Domain("bDom", "-p sys_nice 5 grant\n");
  EXPECT_THAT(LoadDomains().Operations({"check-capability-params", "set-rule"}),
              ElementsAre("check-capability-params aDom; -p net_bind_service 80 grant # line 1; -p "
                          "net_bind_service 443 revoke # line 2",
                          "check-capability-params bDom; -p sys_nice 5 grant # line 1",
                          "set-rule aDom -p net_bind_service 80 grant # line 1",
                          "set-rule aDom -p net_bind_service 443 revoke # line 2",
                          "set-rule bDom -p sys_nice 5 grant # line 1"));
}

TEST_F(ConstraintTest, AContradictionSkipsItsDomainOnly) {
  Domain("aDom", kContradiction);
  Domain("bDom", "-s close grant\n");
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "Failure in domain policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Policy constraint error for domain: aDom : the capability "
                          "\"net_bind_service\" with the parameter \"80\" of the domain \"aDom\" "
                          "is granted on line 1 and revoked on line 3",
                          "Error in policy constraints check for some domains",
                          "Skipping the policy for domain aDom due to errors in the policy",
                          "Error in setting the policy for some domains"));
  EXPECT_THAT(RulesOf("aDom"), IsEmpty());
  EXPECT_THAT(RulesOf("bDom"), ElementsAre("-s close grant"));
}

TEST_F(ConstraintTest, TheOtherDomainsAreCheckedAfterAFailure) {
  for (const char* domain : {"aDom", "bDom", "cDom"}) Domain(domain, "-s close grant\n");
  Fail(Operation::kCheckCapabilityParams, 1);
  Fail(Operation::kCheckCapabilityParams, 3);
  const Outcome outcome = LoadDomains();
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Policy constraint error for domain: aDom : refused on request: "
                          "check-capability-params, call 1",
                          "Policy constraint error for domain: cDom : refused on request: "
                          "check-capability-params, call 3",
                          "Error in policy constraints check for some domains",
                          "Skipping the policy for domain aDom due to errors in the policy",
                          "Skipping the policy for domain cDom due to errors in the policy",
                          "Error in setting the policy for some domains"));
  EXPECT_THAT(outcome.Operations({"set-rule"}),
              ElementsAre("set-rule bDom -s close grant # line 1"));
}

TEST_F(ConstraintTest, RulesOfADomainThatFailedToParseAreCheckedToo) {
  Domain("aDom", std::string(kContradiction) + "-x\n");
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.Errors().size(), 6u);
  EXPECT_EQ(outcome.Errors().at(0),
            "Error in parsing policy for domain: aDom: 4 : invalid policy rule type (-x)");
  EXPECT_EQ(outcome.Errors().at(4),
            "Skipping the policy for domain aDom due to errors in the policy");
  EXPECT_THAT(RulesOf("aDom"), IsEmpty());
}

TEST_F(ConstraintTest, SkippedRulesLeaveWhatTheKernelHeldBefore) {
  Domain("aDom", "-s close grant\n");
  EXPECT_EQ(LoadDomains().error, "");
  Domain("aDom", kContradiction);
  EXPECT_EQ(LoadDomains().error, "Failure in domain policy");
  EXPECT_THAT(RulesOf("aDom"), ElementsAre("-s close grant"));
}

}  // namespace
}  // namespace SecPolicyTest
