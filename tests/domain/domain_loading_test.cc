// The domain stage: all domains first, then three phases over all of them.
#include <filesystem>

#include "host/attached_host.h"
#include "tests/domain/domain_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class DomainLoadingTest : public DomainTest {};

TEST_F(DomainLoadingTest, AnEmptyDirectoryIsAPolicy) {
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events, ElementsAre("info: Parsed all domain names",
                                          "info: Domain policies parsed and syntax validated",
                                          "info: Constraints check for domain policies succeeded",
                                          "info: Domain policies set"));
}

TEST_F(DomainLoadingTest, AMissingDirectoryEndsTheStage) {
  std::filesystem::remove(PolicyPath("domains"));
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "Unable to open policy directory " + PolicyPath("domains"));
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(DomainLoadingTest, EveryPhaseGoesOverAllDomainsInTheOrderOfTheirNames) {
  Domain("bDom", "-s close grant\n");
  Domain("aDom", "-s openat grant\n");
  EXPECT_THAT(
      LoadDomains().events,
      ElementsAre("kernel: find-domain aDom", "kernel: create-domain aDom policy",
                  "kernel: find-domain bDom", "kernel: create-domain bDom policy",
                  "info: Parsed all domain names", "kernel: validate-word syscall openat",
                  "kernel: validate-word syscall close",
                  "info: Domain policies parsed and syntax validated",
                  "kernel: check-capability-params aDom", "kernel: check-capability-params bDom",
                  "info: Constraints check for domain policies succeeded",
                  "kernel: set-rule aDom -s openat grant # line 1",
                  "kernel: set-rule bDom -s close grant # line 1", "info: Domain policies set"));
}

TEST_F(DomainLoadingTest, AnExistingDomainIsUsedWithItsId) {
  const unsigned int id = 1;
  EXPECT_EQ(Run([] { return SecPolicy::CreateDomain("bDom"); }).value, std::to_string(id));
  Domain("aDom", "");
  Domain("bDom", "-d default bDom exec grant\n");
  EXPECT_THAT(LoadDomains().Operations({"create-domain", "set-rule"}),
              ElementsAre("create-domain aDom policy",
                          "set-rule bDom -d default bDom exec grant # line 1 into 1"));
}

TEST_F(DomainLoadingTest, ASecondLoadCreatesNothing) {
  Domain("aDom", "-s close grant\n");
  EXPECT_EQ(LoadDomains().error, "");
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Operations({"create-domain"}), IsEmpty());
  EXPECT_THAT(RulesOf("aDom"), ElementsAre("-s close grant"));
}

// ---- Failing phases ---------------------------------------------------------------------------

TEST_F(DomainLoadingTest, ADomainThatCannotBeCreatedEndsTheStage) {
  for (const char* domain : {"aDom", "bDom", "cDom"}) Domain(domain, "-s close grant\n");
  Fail(Operation::kCreateDomain, 2, ENOSPC);
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "Failed to create domain: bDom");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: find-domain aDom", "kernel: create-domain aDom policy",
                          "kernel: find-domain bDom",
                          "kernel: create-domain bDom policy ! refused on request: "
                          "create-domain, call 2"));
  EXPECT_THAT(RulesOf("aDom"), IsEmpty());
  EXPECT_THAT(RulesOf("bDom"), ElementsAre("(no such domain)"));
}

TEST_F(DomainLoadingTest, AFileNameThatIsNoDomainNameEndsTheStage) {
  const std::string name(128, 'n');
  Domain(name, "");
  EXPECT_EQ(LoadDomains().error, "Failed to create domain: " + name);
}

TEST_F(DomainLoadingTest, AFailingLookupOfADomainEndsTheStage) {
  Domain("aDom", "-s close grant\n");
  Fail(Operation::kFindDomain);
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "refused on request: find-domain, call 1");
  EXPECT_THAT(outcome.Infos(), IsEmpty());
}

TEST_F(DomainLoadingTest, LinesBeforeABadOneAreSetAndSoAreTheOtherDomains) {
  Domain("aDom", "-s openat grant\n-s close grant\n-s read\n-s write grant\n");
  Domain("bDom", "-s write grant\n");
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "Failure in domain policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Error in parsing policy for domain: aDom: 3 : incorrect number of "
                          "arguments for this rule type",
                          "Error in parsing the policy for some domains"));
  EXPECT_THAT(outcome.Infos(), ElementsAre("Parsed all domain names",
                                           "Constraints check for domain policies succeeded",
                                           "Domain policies set"));
  EXPECT_THAT(RulesOf("aDom"), ElementsAre("-s openat grant", "-s close grant"));
  EXPECT_THAT(RulesOf("bDom"), ElementsAre("-s write grant"));
}

TEST_F(DomainLoadingTest, EachDomainsParseErrorIsReported) {
  for (const char* domain : {"aDom", "bDom", "cDom"}) Domain(domain, "-x\n");
  EXPECT_THAT(LoadDomains().Errors(),
              ElementsAre("Error in parsing policy for domain: aDom: 1 : invalid policy rule type "
                          "(-x)",
                          "Error in parsing policy for domain: bDom: 1 : invalid policy rule type "
                          "(-x)",
                          "Error in parsing policy for domain: cDom: 1 : invalid policy rule type "
                          "(-x)",
                          "Error in parsing the policy for some domains"));
}

TEST_F(DomainLoadingTest, ASetErrorKeepsTheRulesBeforeItAndTheOtherDomains) {
  Domain("aDom",
         "-s openat grant\n-s close grant\n-u default stream grant\n-a default read grant\n");
  Domain("bDom", "-s write grant\n");
  Fail(Operation::kSetRule, 3);
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "Failure in domain policy");
  EXPECT_THAT(outcome.Errors(), ElementsAre("Error in setting policy for domain: aDom: 2 : refused "
                                            "on request: set-rule, call 3",
                                            "Error in setting the policy for some domains"));
  EXPECT_THAT(RulesOf("aDom"), ElementsAre("-a default read grant", "-s openat grant"));
  EXPECT_THAT(RulesOf("bDom"), ElementsAre("-s write grant"));
}

TEST_F(DomainLoadingTest, EveryPhaseReportsItsOwnFailure) {
  Domain("aDom", "-x\n");
  Domain("bDom", "-p sys_nice 5 grant\n-p sys_nice 5 revoke\n");
  Domain("cDom", "-s close grant\n");
  Fail(Operation::kSetRule);
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "Failure in domain policy");
  EXPECT_THAT(outcome.Infos(), ElementsAre("Parsed all domain names"));
  EXPECT_THAT(outcome.Errors(),
              ElementsAre(testing::StartsWith("Error in parsing policy for domain: aDom: 1 : "),
                          "Error in parsing the policy for some domains",
                          testing::StartsWith("Policy constraint error for domain: bDom : "),
                          "Error in policy constraints check for some domains",
                          "Skipping the policy for domain bDom due to errors in the policy",
                          testing::StartsWith("Error in setting policy for domain: cDom: 1 : "),
                          "Error in setting the policy for some domains"));
}

// Removes a file once the domains have been looked up, when the files have been listed but not
// read.
class FileRemover final : public StandIn::OperationHook {
 public:
  explicit FileRemover(std::string file) : file_(std::move(file)) {}

  void Around(const StandIn::OperationCall& call, const StandIn::Callable<void>& proceed) override {
    if (call.operation == Operation::kFindDomain) std::filesystem::remove(file_);
    proceed();
  }

 private:
  std::string file_;
};

TEST_F(DomainLoadingTest, AFileThatCannotBeReadFailsItsDomainOnly) {
  Domain("aDom", "-s openat grant\n");
  Domain("bDom", "-s close grant\n");
  const Outcome outcome = Run([&] {
    // The session's own point: an operation within another one would be refused. The hook has to
    // outlive the session, which ends with this process.
    static FileRemover remover(PolicyPath("domains/aDom"));
    const_cast<StandIn::OperationPoint&>(StandIn::Attached()->point).Add(remover);
    SecPolicy::ZekAccessInterfaceImpl iface;
    SecPolicy::LoadPolicyDomains(PolicyPath("domains"), iface);
  });
  EXPECT_EQ(outcome.error, "Failure in domain policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Unable to open policy file " + PolicyPath("domains/aDom"),
                          "Error in parsing the policy for some domains"));
  EXPECT_THAT(RulesOf("bDom"), ElementsAre("-s close grant"));
}

}  // namespace
}  // namespace SecPolicyTest
