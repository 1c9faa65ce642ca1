// What of outside bytes is shown as it is, and what is escaped.
#include "host/text/escaped.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "host/text/quoted_name.h"

namespace StandIn {
namespace {

std::string Shown(std::string_view bytes) { return Escaped(bytes).Text(); }

TEST(EscapedTest, TextStaysAsItIs) {
  for (const char* text : {"", "a b~", "gr\xC3\xBC\xC3\x9F", "\xE2\x82\xAC", "\xF0\x9F\x94\x92",
                           "\xD8\xB9\xD8\xB1", "\xC2\xA0", "\\x1b"}) {
    EXPECT_EQ(Shown(text), text);
  }
}

TEST(EscapedTest, ControlsAreWrittenOut) {
  EXPECT_EQ(Shown("a\tb\x1b[0m\x7f\r\n"), "a\\x09b\\x1b[0m\\x7f\\x0d\\x0a");
  EXPECT_EQ(Shown(std::string_view("a\0b", 3)), "a\\x00b");
  EXPECT_EQ(Shown("\xC2\x80\xC2\x9B\xC2\x9F"), "\\xc2\\x80\\xc2\\x9b\\xc2\\x9f");
}

// In UTF-8, the first and the last of each range.
TEST(EscapedTest, WhatSetsTheDirectionOrIsNotSeenIsWrittenOut) {
  const std::vector<std::string> unseen{
      "\xE2\x80\xAA", "\xE2\x80\xAE",      // U+202A, U+202E
      "\xE2\x81\xA6", "\xE2\x81\xA9",      // U+2066, U+2069
      "\xE2\x80\x8E", "\xE2\x80\x8F",      // U+200E, U+200F
      "\xD8\x9C",                          // U+061C
      "\xE2\x80\x8B", "\xE2\x80\x8D",      // U+200B, U+200D: zero-width
      "\xE2\x81\xA0", "\xEF\xBB\xBF",      // U+2060, U+FEFF
      "\xC2\xAD",     "\xE1\xA0\x8E",      // U+00AD, U+180E
      "\xE2\x80\xA8", "\xE2\x80\xA9",      // U+2028, U+2029: separators
      "\xEF\xB8\x8F", "\xF3\xA0\x80\x81",  // U+FE0F, U+E0001
      "\xEF\xBF\xBE", "\xEF\xBF\xBF",      // U+FFFE, U+FFFF
      "\xE3\x85\xA4", "\xF3\xA0\xBF\xBF",  // U+3164, U+E0FFF
  };
  for (const std::string& character : unseen) {
    std::string written;
    for (const char byte : character) AppendEscaped(written, byte);
    EXPECT_EQ(Shown("a" + character + "b"), "a" + written + "b");
  }
}

TEST(EscapedTest, BytesThatAreNotUtf8AreWrittenOut) {
  EXPECT_EQ(Shown("\xFF"), "\\xff");
  EXPECT_EQ(Shown("\xE2\x80"), "\\xe2\\x80");                    // cut short
  EXPECT_EQ(Shown("\xC0\x9B"), "\\xc0\\x9b");                    // a longer form than needed
  EXPECT_EQ(Shown("\xED\xA0\x80"), "\\xed\\xa0\\x80");           // a surrogate
  EXPECT_EQ(Shown("\xF4\x90\x80\x80"), "\\xf4\\x90\\x80\\x80");  // beyond the last
  EXPECT_EQ(Shown("\x9B"), "\\x9b");
}

TEST(EscapedTest, Table) {
  struct Case {
    std::string text;
    std::string visible;
  };
  for (const Case& row : {
           Case{"", ""},
           Case{"plain /etc/hosts", "plain /etc/hosts"},
           Case{std::string("a\0b", 3), R"(a\x00b)"},
           Case{"a\tb\r\n\x1b[2J\x7f", R"(a\x09b\x0d\x0a\x1b[2J\x7f)"},
           Case{"grün, 域, 🙂", "grün, 域, 🙂"},
           // What has no shape, or turns the direction of writing.
           Case{std::string("a\xe2\x80") + "\xae.", R"(a\xe2\x80\xae.)"},
           Case{"a\u200bb\ufeff", R"(a\xe2\x80\x8bb\xef\xbb\xbf)"},
           Case{"a\u0085", R"(a\xc2\x85)"},
           // What is no UTF-8: lone bytes, cut short, overlong, surrogates, beyond the last.
           Case{"a\xff\x80z", R"(a\xff\x80z)"},
           Case{"\xe5\x9f", R"(\xe5\x9f)"},
           Case{"\xe5\x9fz", R"(\xe5\x9fz)"},
           Case{"\xc0\xbc", R"(\xc0\xbc)"},
           Case{"\xe0\x80\xbc", R"(\xe0\x80\xbc)"},
           Case{"\xed\xa0\x80", R"(\xed\xa0\x80)"},
           Case{"\xf4\x90\x80\x80", R"(\xf4\x90\x80\x80)"},
           Case{"\xf8\x88\x80\x80\x80", R"(\xf8\x88\x80\x80\x80)"},
       }) {
    EXPECT_EQ(Shown(row.text), row.visible);
  }
}

TEST(QuotedNameTest, ShowsWhatATerminalWouldObey) {
  EXPECT_EQ(QuotedName("etc/motd"), "\"etc/motd\"");
  EXPECT_EQ(QuotedName("\x1b[2J\n\x7f"), "\"\\x1b[2J\\x0a\\x7f\"");
  EXPECT_EQ(QuotedName("a\"b\\c"), "\"a\\x22b\\x5cc\"");
  EXPECT_EQ(QuotedName("\xC3\xA4"), "\"\xC3\xA4\"");
  EXPECT_EQ(QuotedName("\xC2\x9B\xE2\x80\xAE\""), "\"\\xc2\\x9b\\xe2\\x80\\xae\\x22\"");
}

TEST(QuotedNameTest, CutsLongNames) {
  EXPECT_EQ(QuotedName(std::string(255, 'a')), "\"" + std::string(255, 'a') + "\"");
  EXPECT_EQ(QuotedName(std::string(256, 'a')), "\"" + std::string(255, 'a') + "...\"");
}

}  // namespace
}  // namespace StandIn
