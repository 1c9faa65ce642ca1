// The word that was probably meant.
#pragma once

#include <optional>
#include <string>
#include <vector>

namespace StandIn {

// The word of `list` that takes the fewest insertions, deletions, replacements and swaps of
// neighbouring characters to become `word`, letter case aside; of several such the first. Nothing
// when each takes more than a third of the longer one's length (at least one is allowed).
std::optional<std::string> NearestWord(const std::string& word,
                                       const std::vector<std::string>& list);

}  // namespace StandIn
