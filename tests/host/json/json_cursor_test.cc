#include "host/json/json_cursor.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <functional>
#include <tuple>

#include "secpolicy/host/host_error.h"

namespace StandIn {
namespace {

using nlohmann::json;
using testing::ElementsAre;
using testing::StartsWith;

std::string MessageOf(const std::function<void()>& action) {
  try {
    action();
  } catch (const HostError& error) {
    return error.what();
  }
  return "(nothing was thrown)";
}

std::string ParseMessage(const std::string& text) {
  return MessageOf([&] { ParseJson(text, "a.json"); });
}

TEST(ParseJson, GivesTheDocument) {
  EXPECT_EQ(ParseJson(R"({"a": [1, "b"]})", "a.json"), (json{{"a", {1, "b"}}}));
}

TEST(ParseJson, NamesLineAndColumnOfAnError) {
  struct Row {
    const char* text;
    const char* start;
  };
  const Row rows[] = {
      {"", "a.json:1:1: syntax error: the file is empty"},
      {"x", "a.json:1:1: syntax error"},
      {"{\"a\": 1,\n \"b\" 2}", "a.json:2:6: syntax error"},
      {"[1,\n\n  nil]", "a.json:3:4: syntax error"},
      {"\"\xff\"", "a.json:1:2: syntax error"},
  };
  for (const Row& row : rows) {
    EXPECT_THAT(ParseMessage(row.text), StartsWith(row.start)) << row.text;
  }
}

TEST(ParseJson, RefusesANumberThatNoMachineHolds) {
  EXPECT_EQ(ParseMessage("[1e999]"), "a.json: number overflow parsing '1e999'");
}

TEST(ParseJson, RefusesAMemberGivenTwice) {
  EXPECT_EQ(ParseMessage(R"({"b": {"a": 1}, "a": 1, "a": 2})"),
            "a.json: gives the member \"a\" of one object twice");
}

TEST(ParseJson, AcceptsTheSameMemberInObjectsWithinOneAnother) {
  EXPECT_EQ(ParseJson(R"({"a": {"a": 1}, "b": [{"a": 1}, {"a": 2}]})", "a.json").size(), 2U);
}

TEST(ParseJson, RefusesNestingThatNoFileOfAHostNeeds) {
  const std::string allowed = std::string(64, '[') + std::string(64, ']');
  EXPECT_NO_THROW(ParseJson(allowed, "a.json"));
  EXPECT_EQ(ParseMessage("[" + allowed + "]"),
            "a.json: is nested more than 64 arrays and objects deep");
  EXPECT_EQ(ParseMessage(std::string(1000000, '[')),
            "a.json: is nested more than 64 arrays and objects deep");
}

class JsonCursorTest : public testing::Test {
 protected:
  JsonCursor Root() const { return {document_, "a.json"}; }

  const json document_ = ParseJson(R"({
    "name": "x", "count": 7, "negative": -1, "fraction": 1.5, "largest": 18446744073709551615,
    "list": ["a", "b"], "mixed": ["a", 2], "inner": {"z": 1, "a/b": [10, {"~": true}]}})",
                                   "a.json");
};

TEST_F(JsonCursorTest, ReadsEachType) {
  EXPECT_EQ(Root().Member("name").String(), "x");
  EXPECT_TRUE(Root().Member("name").IsString());
  EXPECT_FALSE(Root().Member("count").IsString());
  EXPECT_EQ(Root().Member("count").Unsigned(0, 10), 7U);
  EXPECT_EQ(Root().Member("largest").Unsigned(0, UINT64_MAX), UINT64_MAX);
  EXPECT_THAT(Root().Member("list").Strings(), ElementsAre("a", "b"));
  EXPECT_EQ(Root().Member("list").Items().size(), 2U);
}

TEST_F(JsonCursorTest, GivesMembersInByteOrder) {
  const auto members = Root().Member("inner").Members();
  ASSERT_EQ(members.size(), 2U);
  EXPECT_EQ(members[0].first, "a/b");
  EXPECT_EQ(members[1].second.Unsigned(1, 1), 1U);
}

TEST_F(JsonCursorTest, FindsAMemberOrNothing) {
  EXPECT_TRUE(Root().Find("name").has_value());
  EXPECT_FALSE(Root().Find("nome").has_value());
}

TEST_F(JsonCursorTest, ANumberAtEitherBoundIsAccepted) {
  EXPECT_EQ(Root().Member("count").Unsigned(7, 9), 7U);
  EXPECT_EQ(Root().Member("count").Unsigned(5, 7), 7U);
}

TEST_F(JsonCursorTest, NamesFilePlaceAndFault) {
  struct Row {
    std::function<void(const JsonCursor&)> read;
    const char* message;
  };
  const Row rows[] = {
      {[](const JsonCursor& root) { std::ignore = root.Member("nome"); },
       "/: lacks the member \"nome\""},
      {[](const JsonCursor& root) { std::ignore = root.Member("name").Member("a"); },
       "/name: must be an object"},
      {[](const JsonCursor& root) { std::ignore = root.Member("list").Find("a"); },
       "/list: must be an object"},
      {[](const JsonCursor& root) { std::ignore = root.Member("list").Members(); },
       "/list: must be an object"},
      {[](const JsonCursor& root) { std::ignore = root.Member("inner").Items(); },
       "/inner: must be an array"},
      {[](const JsonCursor& root) { std::ignore = root.Member("count").String(); },
       "/count: must be a string"},
      {[](const JsonCursor& root) { std::ignore = root.Member("mixed").Strings(); },
       "/mixed/1: must be a string"},
      {[](const JsonCursor& root) { std::ignore = root.Member("count").Unsigned(8, 9); },
       "/count: must be a whole number from 8 to 9"},
      {[](const JsonCursor& root) { std::ignore = root.Member("count").Unsigned(5, 6); },
       "/count: must be a whole number from 5 to 6"},
      {[](const JsonCursor& root) { std::ignore = root.Member("negative").Unsigned(0, 9); },
       "/negative: must be a whole number from 0 to 9"},
      {[](const JsonCursor& root) { std::ignore = root.Member("fraction").Unsigned(0, 9); },
       "/fraction: must be a whole number from 0 to 9"},
      {[](const JsonCursor& root) {
         root.Member("inner").AllowOnly({"z", "a"});
       },
       "/inner/a~1b: unknown member"},
      {[](const JsonCursor& root) {
         root.Member("inner").Member("a/b").Items()[1].Member("~").Fail("is odd");
       },
       "/inner/a~1b/1/~0: is odd"},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(MessageOf([&] { row.read(Root()); }), std::string("a.json: ") + row.message);
  }
}

TEST_F(JsonCursorTest, AllowsTheMembersNamed) {
  EXPECT_NO_THROW(Root().Member("inner").AllowOnly({"z", "a/b", "c"}));
}

std::string FormatMessage(const json& document) {
  return MessageOf([&] { ExpectFormat({document, "a.json"}, 1); });
}

TEST(ExpectFormat, AcceptsTheKnownFormatOnly) {
  EXPECT_EQ(FormatMessage({{"format", 1U}}), "(nothing was thrown)");
  EXPECT_EQ(FormatMessage({{"format", 2U}}),
            "a.json: /format: format 2 is not known here, only format 1");
  EXPECT_EQ(FormatMessage(json::object()), "a.json: /: lacks the member \"format\"");
}

std::string Decoded(const std::string& encoded) {
  const json document(encoded);
  return DecodeBytes(JsonCursor(document, "a.json"));
}

TEST(EncodeBytes, KeepsAsciiAndEscapesTheRest) {
  EXPECT_EQ(EncodeBytes("a b/\"c\"\n"), "a b/\"c\"\n");
  EXPECT_EQ(EncodeBytes("\x7f\x80\xff%"), "\x7f%80%FF%25");
}

TEST(EncodeBytes, EveryByteSurvives) {
  for (int byte = 0; byte < 256; ++byte) {
    const std::string bytes(1, static_cast<char>(byte));
    EXPECT_EQ(Decoded(json::parse(json(EncodeBytes(bytes)).dump()).get<std::string>()), bytes)
        << byte;
  }
}

TEST(DecodeBytes, AcceptsBothCasesAndLeavesUtf8AsItIs) {
  EXPECT_EQ(Decoded("%c3%A9\xc3\xa9"), "\xc3\xa9\xc3\xa9");
}

TEST(DecodeBytes, RefusesAMalformedEscape) {
  for (const char* encoded : {"%", "a%", "%4", "%4g", "%g4", "%%20", "% 20"}) {
    EXPECT_EQ(MessageOf([&] { Decoded(encoded); }),
              "a.json: /: holds \"%\" without two hexadecimal digits behind it")
        << encoded;
  }
}

}  // namespace
}  // namespace StandIn
