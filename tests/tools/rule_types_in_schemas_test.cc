// The documents for programs list the rule types that there are.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <nlohmann/json.hpp>

#include "platform/rule_types.h"

namespace SecPolicyTool {
namespace {

using nlohmann::json;

json Keywords() {
  json keywords = json::array();
  for (const auto& info : ZekCtl::Security::kRuleTypes) keywords.push_back(info.keyword);
  return keywords;
}

// Compares each list of keywords in `schema`; gives back how many there were.
int CompareLists(const json& schema, const std::string& file) {
  int compared = 0;
  if (schema.is_object() && schema.contains("enum") && schema["enum"].is_array() &&
      !schema["enum"].empty() && schema["enum"][0] == "-a") {
    EXPECT_EQ(schema["enum"], Keywords()) << file;
    ++compared;
  }
  if (schema.is_structured()) {
    for (const json& part : schema) compared += CompareLists(part, file);
  }
  return compared;
}

TEST(RuleTypesInSchemasTest, EverySchemaListsAllTypes) {
  int compared = 0;
  for (const auto& file : std::filesystem::directory_iterator(SECPOLICY_SCHEMAS)) {
    std::ifstream text(file.path());
    compared += CompareLists(json::parse(text), file.path().filename());
  }
  EXPECT_GE(compared, 8);
}

}  // namespace
}  // namespace SecPolicyTool
