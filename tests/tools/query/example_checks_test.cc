// The statements about the example host's policy.
#include <filesystem>

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

namespace fs = std::filesystem;

const fs::path kExamples = SECPOLICY_EXAMPLES;

using ExampleChecksTest = CommandTest;

TEST_F(ExampleChecksTest, ExamplesPolicyDoesWhatItsChecksExpect) {
  Done({"host", "init", Host()});
  const Result packed = RunProgram("/bin/bash",
                                   {kExamples.parent_path() / "scripts/pack-tardisks",
                                    kExamples / "host/tardisks", Host() + "/tardisks"},
                                   [] {});
  ASSERT_EQ(packed.status, 0) << packed.err;
  Done({"host", "assemble", Host()});
  Done({"load", "--host", Host()});
  const Result result = Command({"test", "--host", Host(), kExamples / "host/checks"});
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.out, "14 statements, 0 failed\n");
  EXPECT_EQ(result.err, "");
}

}  // namespace
}  // namespace SecPolicyTool
