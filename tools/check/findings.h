// The findings of a check, as they are gathered.
#pragma once

#include <string>
#include <unordered_set>
#include <vector>

#include "tools/check/finding.h"
#include "tools/check/finding_kinds.h"
#include "tools/check/policy_directory.h"

namespace SecPolicyTool {

// What a finding is about.
struct Spot {
  Place place;
  unsigned int length = 0;
  std::string source;
};

Spot SpotOf(const CheckedFile& file);
// All words of the line.
Spot SpotOf(const CheckedFile& file, const PolicyLine& line);
Spot SpotOf(const CheckedFile& file, const PolicyLine& line, const LineWord& word);
// The words from `first` to the last.
Spot SpotFrom(const CheckedFile& file, const PolicyLine& line, std::size_t first);

class Findings {
 public:
  // An error, which a load reports in the words of `loadMessage`.
  void AddError(Kind kind, Spot spot, std::string message, std::string loadMessage,
                std::string help = {});
  void AddWarning(Kind kind, Spot spot, std::string message, std::string help = {});

  // Whether an error stands for what a load reports in these words.
  [[nodiscard]] bool Explains(const std::string& loadMessage) const {
    return loadMessages_.contains(loadMessage);
  }

  // In the order of files, lines and columns; those without a file last.
  [[nodiscard]] std::vector<Finding> Sorted() &&;

 private:
  std::vector<Finding> findings_;
  std::unordered_set<std::string> loadMessages_;
};

}  // namespace SecPolicyTool
