// A second reading of policy files: slow, and as plain as the rules that it follows.
#pragma once

#include <map>
#include <string>
#include <vector>

namespace Fuzz {

using PlainWords = std::vector<std::string>;
using PlainLines = std::map<unsigned int, PlainWords>;

// The words of a line, character by character.
PlainWords PlainWordsOf(const std::string& line);

// The lines of a file that have words, by their numbers.
PlainLines PlainLinesOf(const std::string& bytes);

// The words with `between` between each two.
std::string Joined(const PlainWords& words, const std::string& between = " ");

}  // namespace Fuzz
