// Printing of what the kernel holds for domains.
#include "tests/domain/domain_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;

constexpr char kBanner[] =
    "\n\n------------------------\nPolicy set in the kernel\n\n------------------------\n";

constexpr char kRootDomain[] =
    "\n\n--------------------------------------------------------------\n"
    "Domain Name: rootDom Domain ID :0 Enforcement Level: enforcing\n"
    "State: 1 RefCount: 1 WorldRefCount: 1\n"
    "--------------------------------------------------------------\n\n";

class DomainDisplayTest : public DomainTest {
 protected:
  // Three slots: rootDom, appDom with a rule of each type, and a free one.
  DomainDisplayTest() {
    Describe(R"({"format": 1, "limits": {"domains": 3}, "enforcementLevel": "enforcing"})");
    Tardisk("base.tgz").Directory("etc").File("etc/passwd", "");
  }

  void LoadAppDom() {
    Domain("appDom",
           "-u default stream grant\n-s openat grant\n-r /etc/passwd\n-r /etc rw\n"
           "-p net_bind_service 80 revoke\n-f default tardisk file grant\n"
           "-d default appDom exec grant\n-c net_admin revoke\n-a default read grant\n"
           "-s close revoke\n");
    ASSERT_EQ(LoadDomains().error, "");
  }

  Outcome DisplayDomains(const std::string& selector = "") {
    return RunWithInterface([&](SecPolicy::ZekAccessInterfaceImpl& iface) {
      SecPolicy::DisplayPolicyDomains(iface, selector);
    });
  }
};

constexpr char kAppDomHeader[] =
    "\n\n-------------------------------------------------------------\n"
    "Domain Name: appDom Domain ID :1 Enforcement Level: enforcing\n"
    "State: 1 RefCount: 1 WorldRefCount: 0\n"
    "-------------------------------------------------------------\n";

constexpr char kAppDomRules[] =
    "-a default read grant\n"
    "-c net_admin revoke\n"
    "-d default appDom exec grant\n"
    "-f default tardisk file grant\n"
    "-p net_bind_service 80 revoke\n"
    "-r /etc/passwd \n"
    "-r /etc rw\n"
    "-s openat grant\n"
    "-s close revoke\n"
    "-u default stream grant\n"
    "\n";

TEST_F(DomainDisplayTest, RulesArePrintedInTheOrderOfTheirTypesAsPolicyLines) {
  LoadAppDom();
  const Outcome outcome = DisplayDomains("1");
  EXPECT_EQ(outcome.out, std::string(kBanner) + kAppDomHeader + kAppDomRules);
  EXPECT_EQ(outcome.err, "");
}

TEST_F(DomainDisplayTest, ADomainWithoutRulesIsItsBannerAndAnEmptyLine) {
  EXPECT_EQ(DisplayDomains("0").out, std::string(kBanner) + kRootDomain);
}

TEST_F(DomainDisplayTest, AllDomainsArePrintedInTheOrderOfTheirIds) {
  LoadAppDom();
  const Outcome outcome = DisplayDomains();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.out, std::string(kBanner) + kRootDomain + kAppDomHeader + kAppDomRules);
  EXPECT_THAT(outcome.Operations({"max-domains", "domain-info"}),
              ElementsAre("max-domains", "domain-info 0", "domain-info 1", "domain-info 2"));
}

TEST_F(DomainDisplayTest, EachTypeIsReadFromTheKernelInItsOrder) {
  LoadAppDom();
  EXPECT_THAT(DisplayDomains("1").Operations(),
              ElementsAre("domain-info 1", "get-rules appDom -a", "get-rules appDom -c",
                          "get-rules appDom -d", "get-rules appDom -f", "get-rules appDom -p",
                          "read-file-rules appDom", "get-rules appDom -s", "get-rules appDom -u"));
}

TEST_F(DomainDisplayTest, AnUnknownIdPrintsTheTitleAlone) {
  const Outcome outcome = DisplayDomains("2");
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.out, kBanner);
  EXPECT_THAT(outcome.Operations(), ElementsAre("domain-info 2"));
}

TEST_F(DomainDisplayTest, CountsOfReferencesArePrinted) {
  Describe(R"({"format": 1, "enforcementLevel": "permissive",
               "worlds": [{"id": 4711, "domain": "appDom"}, {"id": 4712, "domain": "appDom"}]})");
  Domain("appDom", "-d default appDom exec grant\n");
  ASSERT_EQ(LoadDomains().error, "");
  const std::string dashes(
      std::string("Domain Name: appDom Domain ID :1 Enforcement Level: ").size() +
          std::string("permissive").size(),
      '-');
  EXPECT_EQ(DisplayDomains("1").out,
            kBanner + ("\n\n" + dashes) +
                "\nDomain Name: appDom Domain ID :1 Enforcement Level: permissive\n"
                "State: 1 RefCount: 3 WorldRefCount: 2\n" +
                dashes + "\n-d default appDom exec grant\n\n");
}

TEST_F(DomainDisplayTest, SelectorsAreReadAsDecimalNumbersWithoutComplaint) {
  struct Row {
    std::string selector;
    std::string id;
  };
  const Row rows[] = {
      {"7abc", "7"},
      {"7", "7"},
      {"007", "7"},
      {" \t7 8", "7"},
      {"+7", "7"},
      {"-1", "4294967295"},
      {"0x7", "0"},
      {"abc", "0"},
      {" ", "0"},
      {"-", "0"},
      {"4294967303", "7"},
      {"4294967296", "0"},
      {"rootDom", "0"},
      {"7.9", "7"},
      {"99999999999999999999", "4294967295"},
      {"-99999999999999999999", "0"},
  };
  for (const Row& row : rows) {
    const Outcome outcome = DisplayDomains(row.selector);
    EXPECT_EQ(outcome.error, "") << row.selector;
    EXPECT_EQ(outcome.Operations().at(0), "domain-info " + row.id) << row.selector;
  }
}

TEST_F(DomainDisplayTest, AWholeDisplayHandsItsSelectorOn) {
  LoadAppDom();
  const Outcome outcome = Display("1x");
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.out, testing::StartsWith(std::string(kBanner) + kAppDomHeader));
  EXPECT_THAT(outcome.out, testing::Not(testing::HasSubstr("rootDom")));
}

}  // namespace
}  // namespace SecPolicyTest
