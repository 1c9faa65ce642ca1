// A word that is none of those that it may be.
#pragma once

#include <string>
#include <vector>

namespace SecPolicyTool {

// `unknown WHAT "WORD" (nearest: NEAREST)`, or without the bracket when none of `known` is near:
// the form in which the kernel refuses words, too. The words are escaped.
std::string UnknownWordText(const std::string& what, const std::string& word,
                            const std::vector<std::string>& known);

}  // namespace SecPolicyTool
