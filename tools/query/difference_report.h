// How the difference of two policies is told.
#pragma once

#include <iosfwd>
#include <nlohmann/json_fwd.hpp>
#include <string>
#include <vector>

#include "tools/policy/terminal.h"
#include "tools/query/difference.h"

namespace SecPolicyTool {

// Prints a heading for each domain that differs, and for objects, tardisks and file labels, and
// below it a line for each difference: "+ " for what only the second policy has, "- " for what only
// the first has, "~ " for what is another. A blank line stands between two headings. Nothing when
// they are equal. `files` are the paths that can have labels (see FoldLabels).
void PrintDifference(const Difference& difference, const std::vector<std::string>& files,
                     const Painter& painter, std::ostream& out);

// {"domains": [...], "objects": [...], "tardisks": [...], "files": [...]}
nlohmann::json DifferenceJson(const Difference& difference);

}  // namespace SecPolicyTool
