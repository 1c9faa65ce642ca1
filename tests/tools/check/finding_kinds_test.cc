// The kinds of findings, their descriptions, and that there are no others.
#include "tools/check/finding_kinds.h"

#include <fstream>
#include <iterator>
#include <set>

#include "domain/file_path_access_rules.h"
#include "tests/support/refusal.h"
#include "tests/tools/check/check_fixture.h"
#include "tools/check/permission_words.h"

namespace SecPolicyTool {
namespace {

std::string ContentOf(const std::string& path) {
  std::ifstream file(path);
  return {std::istreambuf_iterator<char>(file), {}};
}

TEST(FindingKinds, AreInOrderAndComplete) {
  std::set<std::string> ids;
  std::string last;
  Severity severity = Severity::kError;
  for (const FindingKind& kind : FindingKinds()) {
    EXPECT_TRUE(ids.insert(kind.id).second) << kind.id;
    if (kind.severity != severity) last.clear();
    EXPECT_LT(last, kind.id);
    last = kind.id;
    severity = kind.severity;
    EXPECT_STRNE(kind.title, "");
    EXPECT_STRNE(kind.help, "");
  }
  EXPECT_STREQ(InfoOf(Kind::kUnusedObject).id, "unused-object");
  EXPECT_STREQ(InfoOf(Kind::kWordCount).id, "word-count");
  EXPECT_STREQ(InfoOf(Kind::kBackupFile).id, "backup-file");
}

TEST(FindingKinds, EachIsExplainedInTheDocumentation) {
  const std::string text = ContentOf(std::string(SECPOLICY_DOCS) + "/findings.md");
  std::size_t headings = 0;
  for (std::size_t at = 0; (at = text.find("\n### `", at)) != std::string::npos; ++at) ++headings;
  EXPECT_EQ(headings, kFindingKinds);
  for (const FindingKind& kind : FindingKinds()) {
    EXPECT_NE(text.find("\n### `" + std::string(kind.id) + "`\n"), std::string::npos) << kind.id;
  }
}

class FindingKindsTest : public CheckTest {
 protected:
  FindingKindsTest() {
    const std::string dir = "etc/olvane/secpolicy/tardisks/";
    vendor_.File(dir + "vendor", "-E nothing appDom\n-E conf appDom\n");
    vendor_.File(dir + "other", "-E conf appDom\n");
  }
};

TEST_F(FindingKindsTest, EachIsMadeByAMistake) {
  using namespace std::string_literals;
  StandIn::WriteBytes(Host() + "/root/etc/alien", "");
  StandIn::WriteBytes(Host() + "/root/etc/olvane/secpolicy/tardisks/alien", "-E cnof appDom\n");
  StandIn::WriteBytes(Host() + "/host.json",
                      R"({"format": 1, "limits": {"fileRulesPerDomain": 2}})");
  std::filesystem::remove(PolicyDir() + "/domains/ioFilterDom");
  std::filesystem::create_directory(PolicyDir() + "/domains/sub");
  std::filesystem::rename(PolicyDir() + "/objects", PolicyDir() + "/object");
  Policy("domains/emptyDom~", "");
  Policy("domains/emptyDom", "");
  Policy("domains/" + std::string(128, 'x'), "");
  Policy("domains/netDom", "-r /etc/motd r\n-r /etc/hosts\n-r /usr r\n");
  Policy("domains/appDom",
         "-s open Grant\n-r /etc/motd z\n-p kill 1 grant\n-p kill 1 revoke\n"
         "-d conf none exec grant\n-S\n-s\n-s open\tgrant\n-s open grant\r\n"
         "-s open grant\n-s open grant\n-s open revoke\0\n-r etc/motd\n-r /none\n#"s +
             std::string(1030, '#') + "\n");
  Policy("fileLabels/base",
         "/* default\n/etc/*/x default\n/etc/alien default\n/etc/motd/* default\n"
         "/etc/motd tardisk\n/etc/motd default\n");
  std::set<std::string> made;
  const auto add = [&] {
    for (const Finding& finding : Findings()) made.insert(finding.id);
  };
  add();
  // What the one mistake hides is that of others.
  std::filesystem::rename(PolicyDir() + "/object", PolicyDir() + "/objects");
  std::filesystem::remove(PolicyDir() + "/domains/" + std::string(128, 'x'));
  Policy("objects/base", "conf\nspare\n");
  Policy("domains/ioFilterDom", "");
  add();
  for (const FindingKind& kind : FindingKinds()) EXPECT_TRUE(made.contains(kind.id)) << kind.id;
  EXPECT_EQ(made.size(), kFindingKinds);
}

TEST(PermissionWords, AreTheLibrarys) {
  const std::string letters = "rwxRa-";
  std::vector<std::string> words{""};
  for (std::size_t i = 0; i < words.size() && words[i].size() < 4; ++i) {
    for (const char letter : letters) words.push_back(words[i] + letter);
  }
  EXPECT_EQ(words.size(), 1555U);
  for (const std::string& word : words) {
    const std::string refusal =
        SecPolicyTest::RefusalOf([&] { SecPolicy::FilePathAccessRules::GetPermission(word); });
    EXPECT_EQ(PermissionProblem(word), refusal) << word;
  }
}

}  // namespace
}  // namespace SecPolicyTool
