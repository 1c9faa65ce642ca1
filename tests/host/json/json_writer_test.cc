#include "host/json/json_writer.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <nlohmann/json.hpp>

namespace StandIn {
namespace {

using nlohmann::json;

constexpr JsonWriter::Kind kObject = JsonWriter::Kind::kObject;
constexpr JsonWriter::Kind kArray = JsonWriter::Kind::kArray;

TEST(JsonWriter, EachEntryOfWhatWasBegunHasALineOfItsOwn) {
  JsonWriter writer;
  writer.Begin(kObject);
  writer.Member("b", 1);
  writer.Member("a", {"x", 2});
  writer.Begin("rows", kArray);
  writer.Item({1, "one", {{"k", json::array()}, {"l", json::object()}}});
  writer.Begin(kObject);
  writer.Member("in\"ner", nullptr);
  writer.End();
  writer.End();
  writer.End();
  EXPECT_EQ(writer.Text(),
            "{\n"
            "  \"b\": 1,\n"
            "  \"a\": [\"x\", 2],\n"
            "  \"rows\": [\n"
            "    [1, \"one\", {\"k\": [], \"l\": {}}],\n"
            "    {\n"
            "      \"in\\\"ner\": null\n"
            "    }\n"
            "  ]\n"
            "}\n");
}

TEST(JsonWriter, WhatIsEmptyTakesOneLine) {
  JsonWriter writer;
  writer.Begin(kArray);
  writer.Begin(kObject);
  writer.End();
  writer.Begin(kArray);
  writer.End();
  writer.End();
  EXPECT_EQ(writer.Text(), "[\n  {},\n  []\n]\n");
}

TEST(JsonWriter, WhatIsBegunOnOneLineStaysThere) {
  JsonWriter writer;
  writer.Begin(kArray);
  writer.BeginLine(kArray);
  writer.String("a");
  writer.Number(18446744073709551615U);
  writer.BeginLine(kArray);
  writer.End();
  writer.Item({1, "b"});
  writer.End();
  writer.BeginLine(kObject);
  writer.Member("c", 1);
  writer.BeginLine("d", kArray);
  writer.End();
  writer.End();
  writer.End();
  EXPECT_EQ(writer.Text(),
            "[\n  [\"a\", 18446744073709551615, [], [1, \"b\"]],\n  {\"c\": 1, \"d\": []}\n]\n");
}

TEST(JsonWriter, AStringIsWrittenInOneFormWhicheverFunctionItIsGivenTo) {
  for (int byte = 0; byte < 128; ++byte) {
    const std::string text = "a" + std::string(1, static_cast<char>(byte)) + "b";
    JsonWriter writer;
    writer.String(text);
    JsonWriter other;
    other.Item(text);
    EXPECT_EQ(writer.Text(), other.Text()) << byte;
  }
}

// A document of some 200,000 bytes.
void WriteRows(JsonWriter& writer) {
  writer.Begin(kArray);
  for (std::uint64_t i = 0; i < 10'000; ++i) {
    writer.BeginLine(kArray);
    writer.Number(i);
    writer.String("some words");
    writer.End();
  }
  writer.End();
}

TEST(JsonWriter, ASinkGetsTheSameTextInParts) {
  JsonWriter kept;
  WriteRows(kept);
  std::string text;
  std::size_t longest = 0;
  JsonWriter writer([&](std::string_view part) {
    text += part;
    longest = std::max(longest, part.size());
  });
  WriteRows(writer);
  writer.Finish();
  EXPECT_EQ(text, kept.Text());
  EXPECT_GT(text.size(), 200'000U);
  EXPECT_LT(longest, 66'000U);
}

}  // namespace
}  // namespace StandIn
