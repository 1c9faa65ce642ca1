#include "tools/check/label_mappings.h"

#include <string_view>
#include <unordered_map>

#include "tools/policy/path_tree.h"

namespace SecPolicyTool {

namespace {

const std::string& LabelOf(const LabelMapping& mapping) { return mapping.line->words.at(1).text; }

std::string PlaceOf(const LabelMapping& mapping) {
  return mapping.file->shown + ":" + std::to_string(mapping.line->number);
}

// The last mappings of each path among those behind the one that is looked at.
class LaterMappings {
 public:
  void Add(const LabelMapping& mapping) {
    if (!mapping.isTree) {
      files_.try_emplace(mapping.path, &mapping);
      return;
    }
    trees_.Visit(mapping.path, [&](const LabelMapping*& last, std::string_view above) {
      if (above.size() >= mapping.path.size() && last == nullptr) last = &mapping;
    });
  }

  // One that labels all that `mapping` does; nullptr for none.
  [[nodiscard]] const LabelMapping* Covering(const LabelMapping& mapping) const {
    if (!mapping.isTree) {
      if (const auto same = files_.find(mapping.path); same != files_.end()) return same->second;
    }
    const LabelMapping* innermost = nullptr;
    trees_.VisitKnown(mapping.path, [&](const LabelMapping* tree, std::string_view) {
      if (tree != nullptr) innermost = tree;
    });
    return innermost;
  }

 private:
  PathTree<const LabelMapping*> trees_;
  std::unordered_map<std::string, const LabelMapping*> files_;
};

bool SaysTheSame(const LabelMapping& a, const LabelMapping& b) {
  return a.path == b.path && a.isTree == b.isTree && LabelOf(a) == LabelOf(b);
}

}  // namespace

void CheckOverrides(const std::vector<LabelMapping>& mappings, Findings& findings) {
  LaterMappings later;
  for (std::size_t i = mappings.size(); i-- > 0;) {
    const LabelMapping& mapping = mappings[i];
    const LabelMapping* covering = later.Covering(mapping);
    later.Add(mapping);
    if (covering == nullptr) continue;
    const Spot spot = SpotOf(*mapping.file, *mapping.line);
    if (SaysTheSame(mapping, *covering)) {
      findings.AddWarning(Kind::kRepeatedRule, spot, PlaceOf(*covering) + " says the same",
                          "remove one of the two");
    } else if (LabelOf(mapping) != LabelOf(*covering)) {
      findings.AddWarning(Kind::kOverriddenLabel, spot,
                          PlaceOf(*covering) + " labels all of it \"" + LabelOf(*covering) + "\"",
                          "remove the line, or put it behind the one that overrides it");
    }
  }
}

}  // namespace SecPolicyTool
