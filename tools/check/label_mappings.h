// File labels against each other.
#pragma once

#include <vector>

#include "tools/check/check_context.h"

namespace SecPolicyTool {

// A line of a file label file in which nothing is wrong.
struct LabelMapping {
  const CheckedFile* file = nullptr;
  const PolicyLine* line = nullptr;
  std::string path;  // without links, and without "/*"
  bool isTree = false;
};

// Adds those of `mappings`, which are in the order of a load, of which nothing stays, and those
// that say what an earlier one says.
void CheckOverrides(const std::vector<LabelMapping>& mappings, Findings& findings);

}  // namespace SecPolicyTool
