// The findings of a check, as they are gathered.
#pragma once

#include <string>
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

// A file or a directory, by what its user calls it.
Spot SpotOf(const std::string& shown);
Spot SpotOf(const CheckedFile& file);
// All words of the line.
Spot SpotOf(const CheckedFile& file, const PolicyLine& line);
Spot SpotOf(const CheckedFile& file, const PolicyLine& line, const LineWord& word);
// `length` bytes from `column` on.
Spot SpotAt(const CheckedFile& file, const PolicyLine& line, std::size_t column,
            std::size_t length);
// The words from `first` to the last.
Spot SpotFrom(const CheckedFile& file, const PolicyLine& line, std::size_t first);

class Findings {
 public:
  // An error, which a load reports in the words of `loadMessage`.
  void AddError(Kind kind, Spot spot, std::string message, std::string loadMessage,
                std::string help = {});
  void AddWarning(Kind kind, Spot spot, std::string message, std::string help = {});

  // In the order in which they were added.
  [[nodiscard]] const std::vector<Finding>& All() const { return findings_; }

  // In the order of files, lines and columns; those without a file last.
  [[nodiscard]] std::vector<Finding> Sorted() &&;

 private:
  std::vector<Finding> findings_;
};

}  // namespace SecPolicyTool
