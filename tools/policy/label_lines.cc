#include "tools/policy/label_lines.h"

#include <filesystem>
#include <string_view>

#include "tools/policy/policy_text.h"

namespace SecPolicyTool {

LabelLines::LabelLines(const PolicyFiles& files) {
  constexpr std::string_view kBelow = "/*";
  std::size_t order = 0;
  for (const std::string& name : PolicyFileNames(files.path + "/fileLabels")) {
    for (const PolicyLine& line : PolicyLines(files.path + "/fileLabels/" + name)) {
      if (line.words.size() != 2) continue;
      std::string path = line.words[0].text;
      const bool isRecursive = path.ends_with(kBelow);
      if (isRecursive) path.erase(path.size() - kBelow.size());
      lines_[WithoutLinks(path)].push_back({order++, isRecursive, line.words[1].text,
                                            PlaceOf(files.shown + "/fileLabels/" + name, line)});
    }
  }
}

const LabelLine* LabelLines::LineFor(const std::string& path,
                                     const std::optional<std::string>& label) const {
  const LabelLine* last = nullptr;
  for (std::filesystem::path above = path;; above = above.parent_path()) {
    if (const auto at = lines_.find(above.string()); at != lines_.end()) {
      for (const LabelLine& line : at->second) {
        const bool covers = line.isRecursive || above == path;
        const bool isLater = last == nullptr || line.order > last->order;
        if (covers && isLater && (!label || line.label == *label)) last = &line;
      }
    }
    if (above == above.parent_path()) return last;
  }
}

}  // namespace SecPolicyTool
