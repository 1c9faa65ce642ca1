// JSON that is checked against the schema that describes it.
#pragma once

#include <string>

namespace SecPolicyTool {

// What is wrong with `text`, by the schema in the file `schema`; empty when nothing is.
std::string SchemaProblem(const std::string& text, const std::string& schema);

// The same with the schema of a verb's --json.
std::string JsonProblem(const std::string& text, const std::string& verb);

}  // namespace SecPolicyTool
