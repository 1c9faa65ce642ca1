// From a line to its words, and the words "grant" and "revoke".
#include <gtest/gtest.h>

#include "secpolicy/secpolicy.h"
#include "tests/core/words.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTest {
namespace {

using StandIn::MessageOf;
using Tavon::Lib::TavonException;

struct LineRow {
  std::string line;
  Words words;
};

const LineRow kWithoutComment[] = {
    {"", {}},
    {" ", {}},
    {"     ", {}},
    {"a", {"a"}},
    {"a b", {"a", "b"}},
    {"grant /bin/ls rx", {"grant", "/bin/ls", "rx"}},
    {"   grant   /bin/ls   rx   ", {"grant", "/bin/ls", "rx"}},
    {"a ", {"a"}},
    {" a", {"a"}},
    {"grant\t/bin/ls rx", {"grant\t/bin/ls", "rx"}},
    {"\t", {"\t"}},
    {" \t ", {"\t"}},
    {"revoke /tmp w\r", {"revoke", "/tmp", "w\r"}},
    {"\r", {"\r"}},
    {"a\nb c", {"a\nb", "c"}},
    {"\v \f", {"\v", "\f"}},
    {"name \"two words\"", {"name", "\"two", "words\""}},
    {"name 'two words'", {"name", "'two", "words'"}},
    {"a\\ b", {"a\\", "b"}},
    {"a\xc2\xa0"
     "b \xff",
     {"a\xc2\xa0"
      "b",
      "\xff"}},
    {std::string("a\0b c", 5), {std::string("a\0b", 3), "c"}},
};

TEST(StringToQueueTest, SplitsAtSpacesOnly) {
  for (const LineRow& row : kWithoutComment) {
    EXPECT_EQ(WordsOf(SecPolicy::StringToQueue(row.line)), row.words) << '"' << row.line << '"';
  }
}

TEST(StringToQueueTest, KnowsNoComments) {
  EXPECT_EQ(WordsOf(SecPolicy::StringToQueue("a#b # c")), (Words{"a#b", "#", "c"}));
}

TEST(StringToQueueTest, LengthIsNotLimited) {
  const std::string word(5000, 'w');
  EXPECT_EQ(WordsOf(SecPolicy::StringToQueue(word + " " + word)), (Words{word, word}));
}

TEST(ParsePolicyLineTest, SplitsALineWithoutACommentAtSpacesOnly) {
  for (const LineRow& row : kWithoutComment) {
    EXPECT_EQ(WordsOf(SecPolicy::ParsePolicyLine(row.line)), row.words) << '"' << row.line << '"';
  }
}

TEST(ParsePolicyLineTest, CommentBeginsAtTheFirstNumberSign) {
  const LineRow rows[] = {
      {"grant /usr/lib r # shared libraries", {"grant", "/usr/lib", "r"}},
      {"# whole-line comment", {}},
      {"#", {}},
      {"   # indented", {}},
      {"a#b c", {"a"}},
      {"a b#", {"a", "b"}},
      {"a # b # c", {"a"}},
      {"a\\#b", {"a\\"}},
      {"\"a # b\"", {"\"a"}},
      {"a ##", {"a"}},
      {"a // b", {"a", "//", "b"}},
      {"a ; b", {"a", ";", "b"}},
      {"\t# after a tab", {"\t"}},
  };
  for (const LineRow& row : rows) {
    EXPECT_EQ(WordsOf(SecPolicy::ParsePolicyLine(row.line)), row.words) << '"' << row.line << '"';
  }
}

TEST(IsGrantTest, KnowsTwoWords) {
  std::string grant = "grant";
  std::string revoke = "revoke";
  EXPECT_TRUE(SecPolicy::IsGrant(grant));
  EXPECT_FALSE(SecPolicy::IsGrant(revoke));
}

TEST(IsGrantTest, RejectsEveryOtherWord) {
  for (std::string word : {"", "Grant", "GRANT", "Revoke", "grants", "gran", "revoke ", " grant",
                           "grant\r", "allow", "deny", "1", "100%d"}) {
    EXPECT_EQ(MessageOf<TavonException>([&] { SecPolicy::IsGrant(word); }),
              "invalid keyword " + word);
  }
}

TEST(IsGrantTest, LeavesTheWordAsItIs) {
  std::string word = "grant";
  SecPolicy::IsGrant(word);
  EXPECT_EQ(word, "grant");
}

}  // namespace
}  // namespace SecPolicyTest
