// The example host.
#include <filesystem>
#include <set>

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

namespace fs = std::filesystem;
using testing::Each;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

const fs::path kExamples = SECPOLICY_EXAMPLES;
const fs::path kTrees = kExamples / "host/tardisks";

// The names in a directory of the policies that the example's tardisks bring.
std::set<std::string> PolicyFiles(const std::string& directory) {
  std::set<std::string> names;
  for (const auto& tree : fs::directory_iterator(kTrees)) {
    const fs::path files = tree.path() / "etc/olvane/secpolicy" / directory;
    if (!fs::exists(files)) continue;
    for (const auto& file : fs::directory_iterator(files)) names.insert(file.path().filename());
  }
  return names;
}

class ExampleHostTest : public CommandTest {
 protected:
  void SetUp() override {
    Done({"host", "init", Host()});
    const Result packed = RunProgram(
        "/bin/bash",
        {kExamples.parent_path() / "scripts/pack-tardisks", kTrees, Host() + "/tardisks"}, [] {});
    ASSERT_EQ(packed.status, 0) << packed.err;
    Done({"host", "assemble", Host()});
  }
};

TEST_F(ExampleHostTest, LoadsWithoutAProblem) {
  const Result result = Command({"load", "--host", Host()});
  EXPECT_EQ(result.status, 0);
  EXPECT_THAT(result.Errors(), Each(Not(StartsWith("Error"))));
  EXPECT_EQ(result.Errors().back(), "System security policy has been set successfully");
}

TEST_F(ExampleHostTest, ItsDomainsAndTardisksAreShown) {
  Done({"load", "--host", Host()});
  const std::string shown = Shown();
  const std::set<std::string> domains = PolicyFiles("domains");
  EXPECT_GE(domains.size(), 20u);
  for (const std::string& domain : domains) {
    EXPECT_THAT(shown, HasSubstr("Domain Name: " + domain + " Domain ID :"));
  }
  for (const auto& tree : fs::directory_iterator(kTrees)) {
    EXPECT_THAT(shown, HasSubstr("/tardisks/" + tree.path().filename().string() + ".tar ("));
  }
}

TEST_F(ExampleHostTest, SecondLoadChangesNothing) {
  Done({"load", "--host", Host()});
  const std::string shown = Shown();
  Done({"load", "--host", Host()});
  EXPECT_EQ(Shown(), shown);
}

}  // namespace
}  // namespace SecPolicyTool
