#include "host/json/json_stream.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <nlohmann/json.hpp>

#include "secpolicy/host/host_error.h"

namespace StandIn {
namespace {

using nlohmann::json;
using testing::ElementsAre;
using testing::IsEmpty;

std::string ErrorOf(const std::function<void()>& action) {
  try {
    action();
  } catch (const HostError& error) {
    return error.what();
  }
  return "(nothing was thrown)";
}

std::string ParseError(const std::string& text) {
  return ErrorOf([&] { ParseJson(text, "a.json"); });
}

std::string StreamError(const std::string& text) {
  return ErrorOf([&] { ParseJsonBut({{{"rows"}}}, ReaderOf(text), "a.json"); });
}

// A value of strings and whole numbers, as a cursor sees it.
json Rebuilt(const JsonCursor& value) {
  if (value.IsString()) return value.String();
  try {
    json array = json::array();
    for (const JsonCursor& item : value.Items()) array.push_back(Rebuilt(item));
    return array;
  } catch (const HostError&) {
  }
  try {
    json object = json::object();
    for (const auto& [key, member] : value.Members()) object[key] = Rebuilt(member);
    return object;
  } catch (const HostError&) {
  }
  return value.Unsigned(0, UINT64_MAX);
}

class JsonStreamTest : public testing::Test {
 protected:
  json Parse(const std::vector<std::vector<std::string>>& paths, const std::string& text) {
    std::vector<JsonArrays> arrays;
    for (const auto& path : paths) {
      arrays.push_back({path, [this](const JsonCursor& element, auto indexes) {
                          elements_.push_back(Described(element, indexes));
                        }});
    }
    return ParseJsonBut(arrays, ReaderOf(text), "a.json").Value();
  }

  // Where an element says that it is, and the indexes that come with it.
  static std::string Described(const JsonCursor& element, std::span<const std::size_t> indexes) {
    std::string text = ErrorOf([&] { element.Fail("here"); });
    for (const std::size_t index : indexes) text += " " + std::to_string(index);
    return text;
  }

  std::vector<std::string> elements_;
  std::string text_;
};

TEST_F(JsonStreamTest, WithoutArraysTheDocumentIsThatOfParseJson) {
  const std::string text = R"({"a": [1, -1, 1.5, true, null, "b", [], {}, {"c": [[2]]}],
                               "d": 18446744073709551615, "e": "\u00e9\ud83d\ude00\"\\"})";
  EXPECT_EQ(Parse({}, text), ParseJson(text, "a.json"));
}

TEST_F(JsonStreamTest, HandsOverTheElementsAndKeepsTheRest) {
  EXPECT_EQ(Parse({{"rows"}}, R"({"a": 1, "rows": [1, [2]], "b": {"rows": [3]}})"),
            json::parse(R"({"a": 1, "rows": [], "b": {"rows": [3]}})"));
  EXPECT_THAT(elements_, ElementsAre("a.json: /rows/0: here 0", "a.json: /rows/1: here 1"));
}

TEST_F(JsonStreamTest, FindsArraysBelowTheElementsOfOthers) {
  EXPECT_EQ(Parse({{"l", "*", "m", "rows"}, {"l", "*", "r"}},
                  R"({"l": [{"m": {"rows": [1]}}, 7, {"r": [2, 3], "s/~": [4]}, [[5]]]})"),
            json::parse(R"({"l": [{"m": {"rows": []}}, 7, {"r": [], "s/~": [4]}, [[5]]]})"));
  EXPECT_THAT(elements_, ElementsAre("a.json: /l/0/m/rows/0: here 0 0",
                                     "a.json: /l/2/r/0: here 2 0", "a.json: /l/2/r/1: here 2 1"));
}

TEST_F(JsonStreamTest, AValueThatIsNoArrayIsKept) {
  const std::string text = R"({"rows": {"rows": [1]}})";
  EXPECT_EQ(Parse({{"rows"}, {"rows", "*"}}, text), json::parse(text));
  EXPECT_THAT(elements_, IsEmpty());
}

TEST_F(JsonStreamTest, TheDocumentItselfMayBeTheArray) {
  EXPECT_EQ(Parse({{}}, "[1, [2]]"), json::array());
  EXPECT_THAT(elements_, ElementsAre("a.json: /0: here 0", "a.json: /1: here 1"));
}

// What an element takes of the memory of the one before must not be seen.
TEST_F(JsonStreamTest, AnElementHoldsNothingOfTheOneBefore) {
  const json rows = json::parse(R"([
    ["a long word that needs memory", 1, ["x", "y"]], ["b"], [], ["c", "d", ["z"], {"k": ["l"]}],
    [{"k": 1}, 2], [{"m": 1}], "word", ["e", 1], {"n": []}, [["f"], []], 3, [[["g"]]]])");
  json taken = json::array();
  ParseJsonBut(
      {{{"rows"}, [&taken](const JsonCursor& row, auto) { taken.push_back(Rebuilt(row)); }}},
      ReaderOf(text_ = json{{"rows", rows}}.dump()), "a.json");
  EXPECT_EQ(taken, rows);
}

TEST_F(JsonStreamTest, AnElementThatIsNoJsonIsNotHandedOver) {
  for (const char* text : {R"(["a", "\udc00"])", R"(["a", 10e308])", R"(["a", ["b"})"}) {
    elements_.clear();
    EXPECT_NE(ErrorOf([&] { Parse({{}}, text); }), "(nothing was thrown)");
    EXPECT_THAT(elements_, ElementsAre("a.json: /0: here 0")) << text;
  }
}

TEST_F(JsonStreamTest, PlacesAreEscaped) {
  Parse({{"a\n/", "*", "rows"}}, R"({"a\n/": [{"rows": [1]}]})");
  EXPECT_THAT(elements_, ElementsAre(R"(a.json: /a\x0a~1/0/rows/0: here 0 0)"));
}

TEST_F(JsonStreamTest, WordsMayCrossTheBordersOfBlocks) {
  for (std::size_t padding = 65530; padding < 65545; ++padding) {
    const std::string text = std::string(padding, ' ') + R"({"word": "\u00e9 and more", "n": 12})";
    EXPECT_EQ(Parse({}, text), json::parse(text)) << padding;
  }
}

TEST_F(JsonStreamTest, RefusesWithTheWordsOfParseJson) {
  const std::string open64(64, '[');
  const std::string close64(64, ']');
  const std::string rows[] = {
      "",
      " ",
      "x",
      "{} x",
      std::string("[\0]", 3),
      std::string("{\"a\0\": 1}", 9),
      "\xef\xbb\xbf",
      "\xef\xbb[]",
      R"({"a": 1, "a": 2})",
      R"({"rows": [{"a": 1, "a": 2}]})",
      R"({"a\u0000b": 1, "a\u0000b": 2})",
      open64 + "1" + close64,
      "[" + open64 + close64 + "]",
      R"({"rows": )" + open64 + close64 + "}",
      std::string(1000000, '['),
      "[1e999]",
      "[10e308]",
      "[" + std::string(400, '9') + "]",
      "[01]",
      "[+1]",
      "[1.]",
      "[NaN]",
      "[Infinity]",
      "[1] // comment",
      "[1,]",
      "['a']",
      "[\"\t\"]",
      R"(["\ud800"])",
      R"(["\udc00"])",
      R"(["\ud800\u0041"])",
      R"({"\udfff": 1})",
      "[\"\xff\"]",
      "[\"\xc0\xaf\"]",
      "[\"\xed\xa0\x80\"]",
      "[\"\xf4\x90\x80\x80\"]",
      "[\"\\x\"]",
      "[\"\\u12g4\"]",
  };
  for (const std::string& text : rows) {
    EXPECT_EQ(StreamError(text), ParseError(text)) << text.substr(0, 100);
    EXPECT_NE(StreamError(text), "(nothing was thrown)") << text.substr(0, 100);
  }
}

TEST_F(JsonStreamTest, AcceptsWhatParseJsonAccepts) {
  const std::string open64(64, '[');
  const std::string close64(64, ']');
  for (const std::string& text :
       {std::string("\xef\xbb\xbf[1]"), open64 + close64, std::string(" [1e308, -0, 1E-999]\r\n\t"),
        std::string("\"\xed\x9f\xbf\xee\x80\x80\\ud7ff\\ue000\x7f\""), std::string("null")}) {
    EXPECT_EQ(StreamError(text), "(nothing was thrown)") << text;
    EXPECT_EQ(Parse({}, text), ParseJson(text, "a.json")) << text;
  }
}

TEST_F(JsonStreamTest, NamesThePlaceOfANumberThatOnlyItsOwnParserRefuses) {
  EXPECT_EQ(StreamError("[1,\n 0e999]"), "a.json:2:2: Number too big to be stored in double.");
}

// For the parser a NUL ends the text.
TEST_F(JsonStreamTest, NothingMayFollowTheDocument) {
  for (const std::string& text : {std::string("{}\n\0", 4), std::string("{}\n\0{", 5)}) {
    EXPECT_EQ(StreamError(text),
              "a.json:2:1: The document root must not be followed by other values.");
  }
}

// Each byte replaced by others, and each beginning of the text.
TEST_F(JsonStreamTest, DamagedTextsAreJudgedAsByParseJson) {
  const std::string sound =
      "{\"a\": [1, -2.5e1, true, null],\n \"rows\": [[\"\xc3\xa9\", \"\\u00e9\\n\"], {\"b\": {}}]}";
  ASSERT_EQ(StreamError(sound), "(nothing was thrown)");
  for (std::size_t at = 0; at < sound.size(); ++at) {
    const std::string beginning = sound.substr(0, at);
    EXPECT_EQ(StreamError(beginning), ParseError(beginning)) << at;
    for (const char byte : std::string_view("\0\n \"\\{}[],:-.0e1tfnu\x7f\x80\xc3\xed\xf0", 25)) {
      std::string damaged = sound;
      damaged[at] = byte;
      EXPECT_EQ(StreamError(damaged), ParseError(damaged)) << damaged;
    }
  }
}

TEST_F(JsonStreamTest, WhatTheTextOrTheCallerThrowsIsPassedOn) {
  EXPECT_EQ(ErrorOf([] {
              ParseJsonBut(
                  {}, [](auto, auto) -> std::size_t { throw HostError("gone"); }, "a.json");
            }),
            "gone");
  const std::string text = R"({"rows": [["a"], ["b"]})";
  const auto refuse = [](const JsonCursor& row, auto) { row.Fail("is odd"); };
  EXPECT_EQ(ErrorOf([&] {
              ParseJsonBut({{{"rows"}, refuse}}, ReaderOf(text), "a.json");
            }),
            "a.json: /rows/0: is odd");
}

}  // namespace
}  // namespace StandIn
