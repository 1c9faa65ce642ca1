// The rule type "-r": paths are resolved by the kernel and sent one by one.
#include <filesystem>

#include "domain/file_path_access_rules.h"
#include "tests/domain/domain_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class PathRulesTest : public DomainTest {
 protected:
  PathRulesTest() {
    Tardisk("base.tgz").Directory("etc").File("etc/passwd", "").Symlink("etc/alias", "passwd");
  }

  // Sets rules of these paths in appDom, with the permission "r".
  Outcome SetPaths(const std::vector<std::string>& paths) {
    return RunWithInterface([&](SecPolicy::ZekAccessInterfaceImpl& iface) {
      const unsigned int domain = DomainCalled("appDom");
      SecPolicy::FilePathAccessRules rules;
      for (const std::string& path : paths) {
        rules.AddRule(1, "appDom", domain, std::queue<std::string>({path, "r"}), iface);
      }
      rules.Set(iface);
    });
  }

  // An existing path within the host of `size` characters; its last component is of `lastSize`.
  std::string LongPath(std::size_t size, std::size_t lastSize = 20) {
    Assemble();
    std::string path = "/";
    while (path.size() + 220 < size) path += std::string(199, 'd') + "/";
    path += std::string(size - path.size() - lastSize - 1, 'd') + "/" + std::string(lastSize, 'l');
    std::filesystem::create_directories(InRoot(path));
    return path;
  }

  static std::string PathError(unsigned int line, const std::string& cause) {
    return "Error in setting policy for domain: appDom: " + std::to_string(line) + " : " + cause;
  }
};

TEST_F(PathRulesTest, EachPathIsResolvedThenSentOnItsOwn) {
  Domain("appDom", "-r /etc/passwd rw\n-r /etc/ r\n");
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Operations({"resolve-path", "add-file-rules"}),
              ElementsAre("resolve-path /etc/passwd", "add-file-rules appDom -r /etc/passwd rw",
                          "resolve-path /etc/", "add-file-rules appDom -r /etc r"));
}

TEST_F(PathRulesTest, TheRuleIsOfThePathThatLinksLeadTo) {
  Domain("appDom", "-r /etc/../etc/./alias x\n");
  const Outcome outcome = LoadDomains();
  EXPECT_THAT(outcome.Infos(),
              testing::Not(testing::Contains(testing::StartsWith("Getting realpath failed"))));
  EXPECT_THAT(RulesOf("appDom"), ElementsAre("-r /etc/passwd x"));
}

TEST_F(PathRulesTest, WithoutLettersTheRulePermitsNothing) {
  Domain("appDom", "-r /etc/passwd\n");
  EXPECT_THAT(LoadDomains().Operations({"add-file-rules"}),
              ElementsAre("add-file-rules appDom -r /etc/passwd "));
  EXPECT_THAT(RulesOf("appDom"), ElementsAre("-r /etc/passwd "));
}

TEST_F(PathRulesTest, AWrongNumberOfWordsIsAParseError) {
  for (const std::string words : {"", " /etc r grant"}) {
    Domain("appDom", "# comment\n-r" + words + "\n");
    const Outcome outcome = LoadDomains();
    EXPECT_THAT(outcome.Errors(),
                ElementsAre("Error in parsing policy for domain: appDom: 2 : incorrect number of "
                            "arguments for this rule type",
                            "Error in parsing the policy for some domains"));
    EXPECT_THAT(outcome.Operations({"add-file-rules"}), IsEmpty()) << words;
  }
}

TEST_F(PathRulesTest, APathThatCannotBeResolvedIsLoggedAndSentAsWritten) {
  Domain("appDom", "-r /no//such/../file r\n");
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Errors(), IsEmpty());
  EXPECT_EQ(outcome.Infos().at(3), "Getting realpath failed: /no//such/../file");
  EXPECT_THAT(outcome.Operations({"add-file-rules"}),
              ElementsAre("add-file-rules appDom -r /no//such/../file r"));
}

TEST_F(PathRulesTest, AFailingResolutionIsNoFailure) {
  Fail(Operation::kResolvePath);
  const Outcome outcome = SetPaths({"/etc/alias", "/etc/alias"});
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Infos(), ElementsAre("Getting realpath failed: /etc/alias"));
  EXPECT_THAT(outcome.Operations({"add-file-rules"}),
              ElementsAre("add-file-rules appDom -r /etc/alias r",
                          "add-file-rules appDom -r /etc/passwd r"));
}

TEST_F(PathRulesTest, BadLettersPassTheParseAndEndTheSetAtTheirRule) {
  Domain("appDom", "-r /a r\n-r /b rr\n-r /c r\n-s close grant\n");
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.error, "Failure in domain policy");
  EXPECT_EQ(outcome.Infos().at(1), "Domain policies parsed and syntax validated");
  EXPECT_THAT(outcome.Errors(), ElementsAre(PathError(2, "Read access already specified."),
                                            "Error in setting the policy for some domains"));
  EXPECT_EQ(outcome.Operations({"resolve-path"}).size(), 2u);  // the letters come after it
  EXPECT_THAT(RulesOf("appDom"), ElementsAre("-r /a r"));
}

TEST_F(PathRulesTest, ARefusedRuleIsReportedWithTheKernelsReason) {
  Domain("appDom", "-r /a r\n-r /b w\n-r /c x\n");
  Fail(Operation::kAddFileRules, 2, ENOSPC);
  const Outcome outcome = LoadDomains();
  EXPECT_EQ(outcome.Errors().at(0),
            PathError(2,
                      "Failed to add file policies to domain :1: world ID :0:No space left on "
                      "device"));
  EXPECT_THAT(RulesOf("appDom"), ElementsAre("-r /a r"));
}

TEST_F(PathRulesTest, ARelativePathIsResolvedLikeAnyOther) {
  Domain("appDom", "-r etc/passwd r\n");
  const Outcome outcome = LoadDomains();
  EXPECT_THAT(outcome.Operations({"resolve-path"}), ElementsAre("resolve-path etc/passwd"));
  EXPECT_THAT(RulesOf("appDom"), ElementsAre("-r /etc/passwd r"));
}

// ---- Long paths -----------------------------------------------------------------------------

TEST_F(PathRulesTest, TheLongestPathIsSentWhole) {
  const std::string path = LongPath(1983);
  const Outcome outcome = SetPaths({path});
  EXPECT_THAT(outcome.Infos(), IsEmpty());
  EXPECT_THAT(outcome.Operations({"add-file-rules"}),
              ElementsAre("add-file-rules appDom -r " + path + " r"));
}

TEST_F(PathRulesTest, AnUnresolvablePathIsCutToTheLongestPath) {
  for (const std::size_t size : {1982u, 1983u, 1984u, 2000u, 100000u}) {
    const std::string path = "/" + std::string(size - 1, 'a');
    const Outcome outcome = SetPaths({path});
    EXPECT_EQ(outcome.error, "") << size;
    EXPECT_THAT(outcome.Infos(), ElementsAre("Getting realpath failed: " + path)) << size;
    EXPECT_THAT(outcome.Operations({"add-file-rules"}),
                ElementsAre("add-file-rules appDom -r " + path.substr(0, 1983) + " r"))
        << size;
  }
}

TEST_F(PathRulesTest, AShortPathThatLeadsToTooLongAOneIsSentAsWritten) {
  const std::string longest = LongPath(1983);
  std::filesystem::create_directory_symlink(longest, InRoot("/short"));
  std::filesystem::create_directory(InRoot(longest + "/x"));
  const Outcome outcome = SetPaths({"/short", "/short/x"});
  EXPECT_THAT(outcome.Infos(), ElementsAre("Getting realpath failed: /short/x"));
  EXPECT_THAT(outcome.Operations({"add-file-rules"}),
              ElementsAre("add-file-rules appDom -r " + longest + " r",
                          "add-file-rules appDom -r /short/x r"));
}

}  // namespace
}  // namespace SecPolicyTest
