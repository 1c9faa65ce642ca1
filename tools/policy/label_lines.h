// Which line of a file-label policy decides on which file.
#pragma once

#include <map>
#include <optional>
#include <string>

#include "tools/policy/path_tree.h"
#include "tools/policy/policy.h"
#include "tools/policy/policy_files.h"

namespace SecPolicyTool {

struct LabelLine {
  std::size_t order = 0;  // among all lines of all files
  std::string label;
  Place place;
};

class LabelLines {
 public:
  // Reads the directory "fileLabels" of `files`. The links of `root`, the host's, decide which
  // files the lines name. Lines that a load would not take are left out.
  LabelLines(const PolicyFiles& files, const StandIn::FileTree& root);

  // The last line that labels the file at `path`, an absolute path without links; with `label`, the
  // last one that gives it that label. nullptr when there is none. Valid as long as this object.
  // Takes time in proportion to the path's length, whatever the number of lines.
  [[nodiscard]] const LabelLine* LineFor(
      const std::string& path, const std::optional<std::string>& label = std::nullopt) const;

 private:
  // Of the lines that name one path in the same way, those that can decide: the last of each label.
  class Lines {
   public:
    void Add(LabelLine line);
    // The last one, or the last one of `label`; nullptr for none.
    [[nodiscard]] const LabelLine* Last(const std::optional<std::string>& label) const;

   private:
    std::map<std::string, LabelLine> byLabel_;
    const LabelLine* last_ = nullptr;
  };

  struct LinesOfPath {
    Lines file;  // that name the path alone
    Lines tree;  // that name it and everything below
  };

  PathTree<LinesOfPath> lines_;
};

}  // namespace SecPolicyTool
