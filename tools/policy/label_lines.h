// Which line of a file-label policy decides on which file.
#pragma once

#include <map>
#include <optional>
#include <string>
#include <vector>

#include "tools/policy/policy.h"
#include "tools/policy/policy_files.h"

namespace SecPolicyTool {

struct LabelLine {
  std::size_t order = 0;  // among all lines of all files
  bool isRecursive = false;
  std::string label;
  Place place;
};

class LabelLines {
 public:
  // Reads the directory "fileLabels" of `files`; to be called in the host, whose links decide which
  // files the lines name. Lines that a load would not take are left out.
  explicit LabelLines(const PolicyFiles& files);

  // The last line that labels the file at `path`, an absolute path without links; with `label`, the
  // last one that gives it that label. nullptr when there is none. Valid as long as this object.
  [[nodiscard]] const LabelLine* LineFor(
      const std::string& path, const std::optional<std::string>& label = std::nullopt) const;

 private:
  std::map<std::string, std::vector<LabelLine>> lines_;  // by path, in their order
};

}  // namespace SecPolicyTool
