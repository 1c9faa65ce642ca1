#include "host/json/json_writer.h"

#include <gtest/gtest.h>
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

}  // namespace
}  // namespace StandIn
