// Texts that are due, as far as they are known beforehand.
#pragma once

#include <functional>
#include <string>
#include <vector>

namespace SecPolicyFaults {

// Where a failure is said to be in the policy, as "{place}" stands for it.
using PlaceCheck = std::function<bool(const std::string& place)>;

// Whether `text` is `pattern`, in which "{any}" stands for any text and "{place}" for one that
// `isPlace` accepts.
bool Matches(const std::string& pattern, const std::string& text, const PlaceCheck& isPlace);

// `pattern` with every `token` replaced.
std::string Filled(std::string pattern, const std::string& token, const std::string& text);

// Whether line LINE of FILE, for a place of the form "FILE:LINE", or of the domain file of DOMAIN
// in `policyDir` for "DOMAIN: LINE", has all of `words`.
bool LineHas(const std::string& place, const std::string& policyDir,
             const std::vector<std::string>& words);

// A line of a policy file: its number, its words before a comment, and where in the file it begins.
struct PolicyLine {
  unsigned int number = 0;
  std::vector<std::string> words;
  std::size_t offset = 0;
};
// The lines that have words.
std::vector<PolicyLine> PolicyLinesOf(const std::string& file);

}  // namespace SecPolicyFaults
