#include "tools/policy/label_lines.h"

#include <string_view>
#include <utility>

#include "tools/policy/policy_text.h"

namespace SecPolicyTool {

namespace {

const LabelLine* Later(const LabelLine* one, const LabelLine* other) {
  if (one == nullptr || other == nullptr) return one == nullptr ? other : one;
  return one->order > other->order ? one : other;
}

}  // namespace

void LabelLines::Lines::Add(LabelLine line) {
  LabelLine& kept = byLabel_[line.label];
  kept = std::move(line);
  last_ = &kept;
}

const LabelLine* LabelLines::Lines::Last(const std::optional<std::string>& label) const {
  if (!label) return last_;
  const auto found = byLabel_.find(*label);
  return found == byLabel_.end() ? nullptr : &found->second;
}

LabelLines::LabelLines(const PolicyFiles& files, const StandIn::FileTree& root) {
  constexpr std::string_view kBelow = "/*";
  std::size_t order = 0;
  for (const std::string& name : PolicyFileNames(files.tree, files.path + "/fileLabels")) {
    for (const PolicyLine& line : PolicyLines(files.tree, files.path + "/fileLabels/" + name)) {
      if (line.words.size() != 2) continue;
      std::string path = line.words[0].text;
      const bool isRecursive = path.ends_with(kBelow);
      if (isRecursive) path.erase(path.size() - kBelow.size());
      path = root.ResolvedOrSame(path);
      if (!path.starts_with('/')) continue;  // leads to no file
      const LabelLine read{order++, line.words[1].text,
                           PlaceOf(files.shown + "/fileLabels/" + name, line)};
      lines_.Visit(path, [&](LinesOfPath& lines, std::string_view above) {
        if (above.size() == path.size()) (isRecursive ? lines.tree : lines.file).Add(read);
      });
    }
  }
}

const LabelLine* LabelLines::LineFor(const std::string& path,
                                     const std::optional<std::string>& label) const {
  const LabelLine* last = nullptr;
  lines_.VisitKnown(path, [&](const LinesOfPath& lines, std::string_view above) {
    last = Later(last, lines.tree.Last(label));
    if (above.size() == path.size()) last = Later(last, lines.file.Last(label));
  });
  return last;
}

}  // namespace SecPolicyTool
