// Text to lines, lines to words, where each stands.
#include "core/policy_lines.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::Pair;

TEST(TakeLineTest, LineEndsAtItsNewlineAndIsReadToItsNul) {
  const std::string text("a\0b\nc", 5);
  std::string_view unread = text;
  const auto first = SecPolicy::TakeLine(unread, true);
  ASSERT_TRUE(first);
  EXPECT_EQ(first->text, "a");
  EXPECT_EQ(first->bytes, text.substr(0, 3));
  EXPECT_FALSE(first->endsFile);
  const auto last = SecPolicy::TakeLine(unread, true);
  ASSERT_TRUE(last);
  EXPECT_EQ(last->text, "c");
  EXPECT_TRUE(last->endsFile);
  EXPECT_FALSE(SecPolicy::TakeLine(unread, true));
}

TEST(TakeLineTest, LineWithoutItsEndIsTakenOnceNothingMoreCanCome) {
  std::string_view unread = "abc";
  EXPECT_FALSE(SecPolicy::TakeLine(unread, false));
  EXPECT_EQ(unread, "abc");
  EXPECT_EQ(SecPolicy::TakeLine(unread, true)->text, "abc");
}

TEST(TakeLineTest, LineThatIsTooLongIsCutAndEndsTheFile) {
  for (const std::size_t length : {1022U, 1023U, 1024U, 1025U}) {
    const std::string text = std::string(length, 'x') + "\nnext";
    std::string_view unread = text;
    const auto line = SecPolicy::TakeLine(unread, false);
    ASSERT_TRUE(line) << length;
    EXPECT_EQ(line->text.size(), std::min<std::size_t>(length, 1023));
    EXPECT_EQ(line->endsFile, length > 1023) << length;
    EXPECT_EQ(unread == "next", !line->endsFile);
  }
}

TEST(ForEachWordTest, WordsHaveTheirPositions) {
  std::vector<std::pair<std::string, std::size_t>> words;
  SecPolicy::ForEachWord("  a  b\tc d", [&](std::string_view word, std::size_t position) {
    words.emplace_back(word, position);
  });
  EXPECT_THAT(words, ElementsAre(Pair("a", 2U), Pair("b\tc", 5U), Pair("d", 9U)));
}

}  // namespace
}  // namespace SecPolicyTest
