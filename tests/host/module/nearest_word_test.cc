#include "host/module/nearest_word.h"

#include <gtest/gtest.h>

namespace StandIn {
namespace {

TEST(NearestWord, IsTheOneWithTheFewestEdits) {
  struct Row {
    const char* word;
    std::vector<std::string> list;
    std::optional<std::string> nearest;
  };
  const Row rows[] = {
      {"open", {"close", "open"}, "open"},
      {"opne", {"close", "open"}, "open"},   // swapped
      {"opn", {"close", "open"}, "open"},    // one missing
      {"oopen", {"close", "open"}, "open"},  // one too many
      {"opem", {"close", "open"}, "open"},   // one wrong
      {"OPEN", {"close", "open"}, "open"},   // letter case
      {"opxx", {"open"}, std::nullopt},      // half of it wrong
      {"socketpiar", {"socket", "socketpair"}, "socketpair"},
      {"getattrs", {"setattr", "getattr"}, "getattr"},
      {"rd", {"ro", "rw"}, "ro"},  // the first of several
      {"r", {"rw"}, "rw"},
      {"x", {"y"}, "y"},  // one edit is always allowed
      {"xx", {"yy"}, std::nullopt},
      {"", {"open"}, std::nullopt},
      {"open", {}, std::nullopt},
      {"a_very_long_word_indeed", {"a"}, std::nullopt},
      {"net_admni", {"net_raw", "net_admin", "sys_admin"}, "net_admin"},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(NearestWord(row.word, row.list), row.nearest) << row.word;
  }
}

TEST(NearestWord, AThirdOfTheLongerWordMayBeWrong) {
  EXPECT_EQ(NearestWord("abcdefxyz", {"abcdefghi"}), "abcdefghi");
  EXPECT_EQ(NearestWord("abcdewxyz", {"abcdefghi"}), std::nullopt);
}

}  // namespace
}  // namespace StandIn
