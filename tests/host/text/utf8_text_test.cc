// Bytes as characters.
#include "host/text/utf8_text.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

namespace StandIn {
namespace {

TEST(Utf8Text, BytesThatMakeNoCharacterAreTold) {
  const std::pair<std::string, std::size_t> kCases[] = {
      {"a", 1},
      {"\xC3\xA4", 2},
      {"\xE2\x82\xAC", 3},
      {"\xF0\x9F\x98\x80", 4},
      {"\x80", 0},
      {"\xC3", 0},
      {"\xC3(", 0},
      {"\xC0\xAF", 0},
      {"\xE0\x80\xAF", 0},
      {"\xED\xA0\x80", 0},
      {"\xF4\x90\x80\x80", 0},
      {"\xFF", 0},
  };
  for (const auto& [text, bytes] : kCases) EXPECT_EQ(CharacterBytes(text), bytes) << text;
  EXPECT_EQ(CharacterCount("a\xC3\xA4\xFF\xE2\x82"), 5U);
  EXPECT_EQ(ValidText("a\xFF"
                      "b\xC3\xA4"),
            "a\xEF\xBF\xBD"
            "b\xC3\xA4");
}

TEST(Utf8Text, IsShortenedBetweenCharacters) {
  EXPECT_EQ(CharacterCount("grün"), 4U);
  EXPECT_EQ(Shortened("grün", 4), "grün");
  EXPECT_EQ(Shortened("grüne", 3), "grü…");
  EXPECT_EQ(Shortened("域域域", 1), "域…");
  EXPECT_EQ(Shortened("", 0), "");
}

}  // namespace
}  // namespace StandIn
