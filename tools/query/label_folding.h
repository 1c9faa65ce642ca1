// Changes of whole directory trees, said once.
#pragma once

#include <string>
#include <vector>

#include "tools/query/difference.h"

namespace SecPolicyTool {

// A change of label of one path, or of a directory and everything below it.
struct FoldedLabel {
  std::string path;       // of a directory with "/*" at its end
  std::size_t files = 1;  // how many have changed, with the directory
  ChangedLabel change;    // of one of them; its places are those of all, or nothing
};

// `changes` with those of whole trees folded. `all` are the paths that can have labels; a directory
// is folded when all of them that are it or below it have changed from the same label to the same
// label, and they are two at least. In the order of `changes`, by the first of each tree.
std::vector<FoldedLabel> FoldLabels(const std::vector<ChangedLabel>& changes,
                                    const std::vector<std::string>& all);

}  // namespace SecPolicyTool
