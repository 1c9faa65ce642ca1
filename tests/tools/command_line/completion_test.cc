// Completion, as the shells do it.
#include <algorithm>
#include <filesystem>
#include <nlohmann/json.hpp>
#include <sstream>

#include "tests/tools/command_fixture.h"
#include "tests/tools/schema.h"

namespace SecPolicyTool {
namespace {

using testing::AllOf;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::IsSupersetOf;
using testing::Not;
using testing::UnorderedElementsAre;

class CompletionTest : public CommandTest {
 protected:
  CompletionTest() {
    for (const char* shell : {"bash", "zsh"}) {
      StandIn::WriteBytes(Path(shell), Done({"completion", shell}).out);
    }
    std::filesystem::create_directory(Path("aDirectory"));
    StandIn::WriteBytes(Path("aFile"), "");
  }

  [[nodiscard]] static std::vector<std::string> Lines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);) lines.push_back(line);
    return lines;
  }

  // What bash offers behind "secpolicy " and these words, the last of which is being typed.
  [[nodiscard]] std::vector<std::string> Bash(const Arguments& words) const {
    static constexpr char kProgram[] = R"(cd "$1" && . ./bash && shift
COMP_WORDS=(secpolicy "$@") COMP_CWORD=$#
_secpolicy && printf '%s\n' "${COMPREPLY[@]}")";
    Arguments arguments{"--norc", "-c", kProgram, "bash", Path("")};
    arguments.insert(arguments.end(), words.begin(), words.end());
    const Result result = RunProgram("/bin/bash", arguments, [] {});
    EXPECT_EQ(result.err, "");
    std::vector<std::string> offered = Lines(result.out);
    std::erase(offered, "");
    return offered;
  }
};

TEST_F(CompletionTest, BashOffersTheVerbs) {
  EXPECT_THAT(Bash({"l"}), ElementsAre("load", "label"));
  EXPECT_THAT(Bash({"host", ""}), IsSupersetOf({"init", "assemble", "info"}));
  EXPECT_THAT(Bash({"label", "v"}), ElementsAre("verify"));
}

TEST_F(CompletionTest, BashOffersTheVerbsOptions) {
  EXPECT_THAT(Bash({"load", "--"}),
              UnorderedElementsAre("--help", "--host", "--wait", "--trust-other-writers", "--trace",
                                   "--fail"));
  EXPECT_THAT(Bash({"label", "set", "--d"}), ElementsAre("--dry-run"));
}

TEST_F(CompletionTest, BashOffersDirectoriesWhereOneIsAskedFor) {
  EXPECT_THAT(Bash({"load", "--host", "a"}), ElementsAre("aDirectory"));
  EXPECT_THAT(Bash({"load", "a"}), ElementsAre("aDirectory"));
  EXPECT_THAT(Bash({"digest", ""}),
              AllOf(Contains("kernel"), Contains("aDirectory"), Not(Contains("aFile"))));
}

TEST_F(CompletionTest, BashKnowsThatAnOptionTakesAValue) {
  // The value is not taken for the verb's argument.
  EXPECT_THAT(Bash({"digest", "--host", "aDirectory", "k"}), ElementsAre("kernel"));
  EXPECT_THAT(Bash({"load", "--trace", "a"}), ElementsAre("aDirectory"));
}

TEST_F(CompletionTest, BashOffersTheValuesOfAClosedSet) {
  EXPECT_THAT(Bash({"completion", ""}), IsSupersetOf({"bash", "zsh", "json"}));
}

TEST_F(CompletionTest, BashOffersNothingWhereAnythingMayStand) {
  EXPECT_THAT(Bash({"domain", "create", ""}), IsEmpty());
}

// A terminal's zsh is asked, since it completes nowhere else.
class ZshCompletionTest : public CompletionTest {
 protected:
  void SetUp() override {
    if (!std::filesystem::exists("/bin/zsh")) GTEST_SKIP() << "zsh is not installed";
  }

  // What zsh lists after "secpolicy " and `typed`.
  [[nodiscard]] std::string Zsh(const std::string& typed) const {
    static constexpr char kProgram[] = R"(
zmodload zsh/zpty
zpty shell zsh -f -i
zpty -w shell "cd $1; autoload -U compinit; compinit -u -D; . ./zsh"
zpty -w shell "bindkey '^I' complete-word; zstyle ':completion:*' list-separator '--'"
zpty -w shell "LISTMAX=9999; setopt no_list_beep; COLUMNS=200; LINES=200; PS1=REA'DY>'"
# Not before its prompt does it read keys as such.
zpty -r -m shell line '*READY>*'
zpty -w -n shell "secpolicy $2"$'\C-d'
zpty -w -n shell $'\C-u'"print -n DO; print NE"$'\n'
zpty -r -m shell all '*DONE*'
print -r -- "$all"
zpty -d shell
)";
    const Result result =
        RunProgram("/usr/bin/timeout",
                   {"60", "/bin/zsh", "-f", "-c", kProgram, "zsh", Path(""), typed}, [] {});
    EXPECT_EQ(result.status, 0) << "zsh did not answer";
    return result.out;
  }
};

TEST_F(ZshCompletionTest, OffersTheVerbsWithWhatTheyDo) {
  EXPECT_THAT(Zsh("la"), HasSubstr("Read, set and compare the labels of files"));
  EXPECT_THAT(Zsh("host "), AllOf(HasSubstr("assemble"), HasSubstr("init")));
}

TEST_F(ZshCompletionTest, OffersOptionsWithWhatTheyMean) {
  EXPECT_THAT(Zsh("load --"), AllOf(HasSubstr("--trace"), HasSubstr("Show every kernel operation"),
                                    HasSubstr("--fail"), Not(HasSubstr("--json"))));
}

TEST_F(ZshCompletionTest, OffersDirectoriesWhereOneIsAskedFor) {
  EXPECT_THAT(Zsh("load --host "), AllOf(HasSubstr("aDirectory"), Not(HasSubstr("aFile"))));
}

TEST_F(ZshCompletionTest, OffersTheValuesOfAClosedSet) {
  EXPECT_THAT(Zsh("completion "), AllOf(HasSubstr("bash"), HasSubstr("zsh"), HasSubstr("json")));
}

// ---- The description of all verbs ----

TEST_F(CompletionTest, EveryVerbIsDescribed) {
  const std::string text = Done({"completion", "json"}).out;
  EXPECT_EQ(JsonProblem(text, "completion"), "");
  EXPECT_THAT(text, AllOf(HasSubstr("\"--dry-run\""), HasSubstr("\"OPERATION[:N]\"")));
}

}  // namespace
}  // namespace SecPolicyTool
