// Command lines: help, version, and what is no use of the command.
#include <filesystem>

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

using testing::HasSubstr;
using testing::MatchesRegex;
using testing::StartsWith;

using UsageTest = CommandTest;

std::string Joined(const Arguments& arguments) {
  std::string text = "secpolicy";
  for (const std::string& argument : arguments) text += " " + argument;
  return text;
}

TEST_F(UsageTest, HelpIsPrintedForEveryVerb) {
  struct Row {
    Arguments arguments;
    const char* contains;
  };
  for (const Row& row :
       {Row{{"--help"}, "Exit status: 0 done, or yes; 1 the policy or the request failed"},
        Row{{"-h"}, "load  "}, Row{{"load", "--help"}, "--fail OPERATION[:N]"},
        Row{{"show", "--help"}, "DOMAIN-ID"}, Row{{"host", "--help"}, "assemble  "},
        Row{{"host", "init", "--help"}, "The directory to make"},
        Row{{"host", "assemble", "--help"}, "The host directory"},
        Row{{"host", "info", "--help"}, "The host directory"}}) {
    const Result result = Command(row.arguments);
    EXPECT_EQ(result.status, 0) << Joined(row.arguments);
    EXPECT_THAT(result.out, HasSubstr(row.contains)) << Joined(row.arguments);
    EXPECT_EQ(result.err, "") << Joined(row.arguments);
  }
}

TEST_F(UsageTest, VersionIsPrinted) {
  const Result result = Done({"--version"});
  EXPECT_THAT(result.out, MatchesRegex("secpolicy [0-9]+\\.[0-9]+\\.[0-9]+\n"));
  EXPECT_EQ(result.err, "");
}

TEST_F(UsageTest, WrongUsageEndsWith2AndDoesNothing) {
  for (const Arguments& arguments : {Arguments{},
                                     Arguments{"frob"},
                                     Arguments{"--frob"},
                                     Arguments{"host"},
                                     Arguments{"host", "frob"},
                                     Arguments{"host", "init"},
                                     Arguments{"host", "assemble"},
                                     Arguments{"host", "info"},
                                     Arguments{"host", "init", "a", "b"},
                                     Arguments{"load", "a", "b"},
                                     Arguments{"load", "--frob"},
                                     Arguments{"load", "--host"},
                                     Arguments{"load", "--fail"},
                                     Arguments{"load", "--fail", "frob"},
                                     Arguments{"load", "--fail", "set-rule:0"},
                                     Arguments{"show", "x"},
                                     Arguments{"show", "-1"},
                                     Arguments{"show", "4294967296"},
                                     Arguments{"show", "1", "2"},
                                     Arguments{"show", "--trace"}}) {
    const Result result = Command(arguments);
    EXPECT_EQ(result.status, 2) << Joined(arguments);
    EXPECT_EQ(result.out, "") << Joined(arguments);
    EXPECT_THAT(result.err, HasSubstr("Run with --help for more information."))
        << Joined(arguments);
  }
  EXPECT_FALSE(std::filesystem::exists(Path("state")));
}

TEST_F(UsageTest, FaultThatIsNoneIsNamed) {
  EXPECT_THAT(Command({"load", "--fail", "frob:1"}).err,
              StartsWith("--fail: no kernel operation is named \"frob\"\n"));
  EXPECT_THAT(Command({"load", "--fail", "set-rule:0"}).err,
              StartsWith("--fail: not the number of a call: \"0\"\n"));
}

}  // namespace
}  // namespace SecPolicyTool
