// The reading with columns, and that it reads what the library reads.
#include "tools/policy/policy_text.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "host/files/file_io.h"
#include "secpolicy/secpolicy.h"
#include "tests/support/archives.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTool {
namespace {

using testing::ElementsAre;

MATCHER_P2(IsWord, text, column, "") { return arg.text == text && arg.column == column; }

TEST(PolicyTextTest, WordsHaveTheColumnsThatTheyStandIn) {
  EXPECT_THAT(WordsOf("  -s  open grant#x"),
              ElementsAre(IsWord("-s", 3U), IsWord("open", 7U), IsWord("grant", 12U)));
}

TEST(PolicyTextTest, LinesAreKeptWhole) {
  const PolicyText text = ReadPolicyText("a # b\n\nc");
  ASSERT_EQ(text.lines.size(), 3U);
  EXPECT_EQ(text.lines[0].whole, "a # b");
  EXPECT_EQ(text.lines[2].number, 3U);
}

TEST(PolicyTextTest, LinesBelowOneThatIsTooLongAreCounted) {
  const PolicyText text = ReadPolicyText(std::string(1024, 'a') + "\nb\nc\n");
  EXPECT_EQ(text.lines.size(), 1U);
  EXPECT_EQ(text.lines[0].words.at(0).text.size(), kLongestLine);
  EXPECT_EQ(text.hiddenLines, 2U);
}

TEST(PolicyTextTest, FileThatCannotBeOpenedIsReportedAsInALoad) {
  EXPECT_THROW(
      {
        try {
          ReadPolicyFile(StandIn::FileTree::Machine(), "/nowhere/file");
        } catch (const std::runtime_error& failure) {
          EXPECT_STREQ(failure.what(), "Unable to open policy file /nowhere/file");
          throw;
        }
      },
      std::runtime_error);
}

std::map<unsigned int, std::vector<std::string>> AsTheLibraryReads(const std::string& path) {
  std::map<unsigned int, std::queue<std::string>> queues;
  SecPolicy::ParseFile(path, queues);
  std::map<unsigned int, std::vector<std::string>> lines;
  for (auto& [number, words] : queues) {
    for (; !words.empty(); words.pop()) lines[number].push_back(words.front());
  }
  return lines;
}

TEST(PolicyTextTest, ReadsWhatTheLibraryReads) {
  const StandIn::TemporaryDirectory directory;
  const std::string path = directory.Path() + "/file";
  const std::string full(1023, 'x');
  const std::string nul("a\0b c\nd", 7);
  for (const std::string& content :
       {std::string(), std::string("\n"), std::string("a"), std::string("a\n"),
        std::string("a\n\n b  c # d\n"), std::string("a\tb\r\nc"), nul, full, full + "\nb",
        full + "x\nb", full + "x", full.substr(9) + " last more\nb", std::string("#\n#\nz")}) {
    StandIn::WriteBytes(path, content);
    std::map<unsigned int, std::vector<std::string>> lines;
    for (const PolicyLine& line : ReadPolicyFile(StandIn::FileTree::Machine(), path).lines) {
      for (const LineWord& word : line.words) lines[line.number].push_back(word.text);
    }
    EXPECT_EQ(lines, AsTheLibraryReads(path)) << content.substr(0, 40);
  }
}

}  // namespace
}  // namespace SecPolicyTool
