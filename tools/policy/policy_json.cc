#include "tools/policy/policy_json.h"

#include <nlohmann/json.hpp>

namespace SecPolicyTool {

nlohmann::json ToJson(const std::optional<Place>& place) {
  if (!place) return nullptr;
  nlohmann::json entry{{"file", place->file.Text()}};
  if (place->line != 0) entry["line"] = place->line;
  if (place->column != 0) entry["column"] = place->column;
  return entry;
}

}  // namespace SecPolicyTool
