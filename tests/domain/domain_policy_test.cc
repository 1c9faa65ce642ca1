// One domain's policy: reading its file, and the order in which its rule sets are set.
#include "domain/domain_policy.h"

#include "tests/domain/domain_fixture.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::DomainPolicy;
using testing::ElementsAre;
using testing::IsEmpty;

// A line of each type, in no particular order.
constexpr char kOneRuleOfEachType[] =
    "-u default stream grant\n"
    "-s openat grant\n"
    "-r /bin rx\n"
    "-p net_bind_service 80 grant\n"
    "-f default tardisk file grant\n"
    "-d default rootDom exec grant\n"
    "-c net_admin revoke\n"
    "-a default read grant\n";

class DomainPolicyTest : public DomainTest {
 protected:
  // Hands an open interface and a policy of appDom, whose file is `text`, to `body`.
  template <typename Body>
  Outcome WithPolicy(const std::string& text, const Body& body) {
    Domain("appDom", text);
    return RunWithInterface([&](SecPolicy::ZekAccessInterfaceImpl& iface) {
      DomainPolicy policy("appDom", DomainCalled("appDom"));
      policy.SetPolicyFile(PolicyPath("domains/appDom"));
      body(policy, iface);
    });
  }

  Outcome ParseAndSet(const std::string& text) {
    return WithPolicy(text, [](DomainPolicy& policy, SecPolicy::ZekAccessInterfaceImpl& iface) {
      try {
        policy.ParsePolicy(iface);
      } catch (const Tavon::Lib::TavonException& failure) {
        SecPolicy::SecpolicyError(failure.what());
      }
      policy.SetPolicy(iface);
    });
  }
};

TEST_F(DomainPolicyTest, APolicyWithoutAFileCannotBeParsed) {
  const Outcome outcome = RunWithInterface([](SecPolicy::ZekAccessInterfaceImpl& iface) {
    DomainPolicy("appDom", 1).ParsePolicy(iface);
  });
  EXPECT_EQ(outcome.error, "Policy file path has not been set for domain appDom");
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(DomainPolicyTest, AFileThatCannotBeOpenedIsNamed) {
  const Outcome outcome = RunWithInterface([](SecPolicy::ZekAccessInterfaceImpl& iface) {
    DomainPolicy policy("appDom", 1);
    policy.SetPolicyFile("/no/such/file");
    policy.ParsePolicy(iface);
  });
  EXPECT_EQ(outcome.error, "Unable to open policy file /no/such/file");
}

TEST_F(DomainPolicyTest, CommentsAndBlankLinesSetNothing) {
  for (const std::string text : {"", "\n\n", "# -s open grant\n\n   \n#", "   # -x\n"}) {
    const Outcome outcome = ParseAndSet(text);
    EXPECT_EQ(outcome.error, "") << text;
    EXPECT_THAT(outcome.events, IsEmpty()) << text;
  }
}

TEST_F(DomainPolicyTest, AnUnknownRuleTypeIsAParseErrorOfItsLine) {
  for (const std::string type : {"-x", "s", "-S", "--s", "-ss", "grant", "-s\t"}) {
    const Outcome outcome = ParseAndSet("# comment\n\n" + type + " openat grant\n");
    EXPECT_THAT(outcome.Errors(), ElementsAre("Error in parsing policy for domain: appDom: 3 : "
                                              "invalid policy rule type (" +
                                              type + ")"));
    EXPECT_THAT(outcome.Operations(), IsEmpty()) << type;
  }
}

TEST_F(DomainPolicyTest, TheFirstBadLineEndsTheParseAndTheLinesBeforeStay) {
  const Outcome outcome =
      ParseAndSet("-s openat grant\n-c net_admin grant\n-s close perhaps\n-s close grant\n-x\n");
  EXPECT_THAT(
      outcome.Errors(),
      ElementsAre("Error in parsing policy for domain: appDom: 3 : invalid keyword perhaps"));
  EXPECT_THAT(outcome.Operations({"set-rule"}),
              ElementsAre("set-rule appDom -c net_admin grant # line 2",
                          "set-rule appDom -s openat grant # line 1"));
}

TEST_F(DomainPolicyTest, RuleSetsAreSetInTheByteOrderOfTheirKeywords) {
  const Outcome outcome = ParseAndSet(kOneRuleOfEachType);
  EXPECT_THAT(
      outcome.Operations({"set-rule", "resolve-path", "add-file-rules"}),
      ElementsAre("set-rule appDom -a default read grant # line 8",
                  "set-rule appDom -c net_admin revoke # line 7",
                  "set-rule appDom -d default rootDom exec grant # line 6 into 0",
                  "set-rule appDom -f default tardisk file grant # line 5",
                  "set-rule appDom -p net_bind_service 80 grant # line 4",
                  "resolve-path /bin ! \"/bin\" cannot be resolved: No such file or directory",
                  "add-file-rules appDom -r /bin rx", "set-rule appDom -s openat grant # line 2",
                  "set-rule appDom -u default stream grant # line 1"));
}

TEST_F(DomainPolicyTest, ARefusalKeepsTheRuleSetsBeforeAndSkipsThoseBehind) {
  Fail(Operation::kSetRule, 4);
  const Outcome outcome = ParseAndSet(kOneRuleOfEachType);
  EXPECT_EQ(outcome.error,
            "Error in setting policy for domain: appDom: 5 : refused on request: set-rule, call 4");
  EXPECT_THAT(outcome.Operations({"add-file-rules"}), IsEmpty());
  EXPECT_THAT(RulesOf("appDom"), ElementsAre("-a default read grant", "-c net_admin revoke",
                                             "-d default rootDom exec grant"));
}

TEST_F(DomainPolicyTest, ARefusedPathSkipsTheRuleSetsBehind) {
  Fail(Operation::kAddFileRules, 1, EPERM);
  const Outcome outcome = ParseAndSet(kOneRuleOfEachType);
  EXPECT_EQ(outcome.error,
            "Error in setting policy for domain: appDom: 3 : Failed to add file policies to "
            "domain :1: world ID :0:Operation not permitted");
  EXPECT_EQ(outcome.Operations().back(),
            "add-file-rules appDom -r /bin rx ! refused on request: add-file-rules, call 1");
}

TEST_F(DomainPolicyTest, AMarkedPolicyIsSkippedWhole) {
  const Outcome outcome = WithPolicy(
      kOneRuleOfEachType, [](DomainPolicy& policy, SecPolicy::ZekAccessInterfaceImpl& iface) {
        policy.ParsePolicy(iface);
        policy.MarkErroneous();
        policy.SetPolicy(iface);
      });
  EXPECT_EQ(outcome.error, "Skipping the policy for domain appDom due to errors in the policy");
  EXPECT_THAT(outcome.Operations({"set-rule", "resolve-path", "add-file-rules"}), IsEmpty());
}

TEST_F(DomainPolicyTest, OnlyCapabilityParametersAreCheckedAsAWhole) {
  const Outcome outcome = WithPolicy(
      kOneRuleOfEachType, [](DomainPolicy& policy, SecPolicy::ZekAccessInterfaceImpl& iface) {
        policy.ParsePolicy(iface);
        SecPolicy::SecpolicyInfo("parsed");
        policy.CheckPolicyConstraints(iface);
      });
  const auto parsed = std::find(outcome.events.begin(), outcome.events.end(), "info: parsed");
  EXPECT_THAT(std::vector<std::string>(parsed + 1, outcome.events.end()),
              ElementsAre("kernel: check-capability-params appDom; -p net_bind_service 80 grant # "
                          "line 4"));
}

TEST_F(DomainPolicyTest, TheListIsCheckedEvenWhenItIsEmpty) {
  const Outcome outcome =
      WithPolicy("", [](DomainPolicy& policy, SecPolicy::ZekAccessInterfaceImpl& iface) {
        policy.CheckPolicyConstraints(iface);
      });
  EXPECT_THAT(outcome.Operations(), ElementsAre("check-capability-params appDom"));
}

}  // namespace
}  // namespace SecPolicyTest
