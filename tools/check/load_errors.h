// What a load reports, and what of it a check has explained.
#pragma once

#include <string>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include "tools/check/findings.h"

namespace SecPolicyTool {

// An error of a load with the place that its text names.
struct LoadError {
  std::string text;
  std::string file;  // as the load names it; a domain's rules by the domain's name
  unsigned int line = 0;
  std::string cause;  // what stands behind the place
};

// The place and the cause of a text in one of the forms "FILE:LINE : CAUSE", "Error in parsing
// policy for domain: NAME: LINE : CAUSE" and "Error in setting policy ...".
LoadError ParseLoadError(const std::string& text);

class LoadErrors {
 public:
  // `texts` as the load reported them, in order.
  explicit LoadErrors(const std::vector<std::string>& texts);

  // The error whose text begins with "FILE:LINE : "; nullptr for none.
  [[nodiscard]] const LoadError* At(const std::string& path, unsigned int line) const;
  // Whether the load ended before it came to tardisks and file labels.
  [[nodiscard]] bool IsTerminated() const;

  // Makes every error that none of `findings` explains a finding of its own, in the place that it
  // names among `directories`. Texts that only sum up are left out when an error that they sum up
  // was reported before them.
  void AddUnexplained(const std::vector<const CheckedDirectory*>& directories,
                      Findings& findings) const;

 private:
  // The texts that an error among `findings` stands for.
  [[nodiscard]] std::unordered_set<std::string_view> Explained(const Findings& findings) const;

  std::vector<LoadError> errors_;
  std::unordered_map<std::string, std::size_t> places_;  // "FILE:LINE" to the error's index
};

}  // namespace SecPolicyTool
