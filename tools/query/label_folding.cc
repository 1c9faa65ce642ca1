#include "tools/query/label_folding.h"

#include <map>
#include <unordered_map>

#include "tools/query/paths.h"

namespace SecPolicyTool {

namespace {

// What is at a path and below it.
struct Tree {
  std::size_t files = 0;
  std::size_t changed = 0;
  const ChangedLabel* first = nullptr;
  bool isAlike = true;  // what has changed has changed like `first`

  [[nodiscard]] bool IsFolded() const { return files > 1 && changed == files && isAlike; }
};

using Trees = std::unordered_map<std::string, Tree>;
using MaybeLabel = std::optional<std::string>;

MaybeLabel LabelOf(const std::optional<LabelledFile>& file) {
  return file ? MaybeLabel(file->label) : std::nullopt;
}

bool IsAlike(const ChangedLabel& one, const ChangedLabel& other) {
  return LabelOf(one.change.before) == LabelOf(other.change.before) &&
         LabelOf(one.change.after) == LabelOf(other.change.after);
}

Trees TreesOf(const std::vector<ChangedLabel>& changes, const std::vector<std::string>& all) {
  std::map<std::string, const ChangedLabel*> byPath;
  for (const std::string& path : all) byPath[path] = nullptr;
  for (const ChangedLabel& change : changes) byPath[change.name] = &change;
  Trees trees;
  for (const auto& [path, change] : byPath) {
    for (const std::string& above : WithParents(path)) {
      Tree& tree = trees[above];
      ++tree.files;
      if (change == nullptr) continue;
      ++tree.changed;
      if (tree.first == nullptr) tree.first = change;
      tree.isAlike = tree.isAlike && IsAlike(*tree.first, *change);
    }
  }
  return trees;
}

// The outermost tree to say `path`'s change with; `path` when it stands alone.
std::string OutermostTree(const std::string& path, const Trees& trees) {
  for (const std::string& above : WithParents(path)) {
    if (trees.at(above).IsFolded()) return above;
  }
  return path;
}

void KeepCommonPlace(std::optional<LabelledFile>& common, const std::optional<LabelledFile>& file) {
  if (common && common->place != file->place) common->place.reset();
}

}  // namespace

std::vector<FoldedLabel> FoldLabels(const std::vector<ChangedLabel>& changes,
                                    const std::vector<std::string>& all) {
  const Trees trees = TreesOf(changes, all);
  std::vector<FoldedLabel> folded;
  std::unordered_map<std::string, std::size_t> indices;
  for (const ChangedLabel& each : changes) {
    const std::string top = OutermostTree(each.name, trees);
    const auto [index, isNew] = indices.emplace(top, folded.size());
    if (isNew) {
      const Tree& tree = trees.at(top);
      const std::string pattern = top == "/" ? "/*" : top + "/*";
      folded.push_back({tree.IsFolded() ? pattern : top, tree.IsFolded() ? tree.files : 1, each});
    } else {
      KeepCommonPlace(folded[index->second].change.change.before, each.change.before);
      KeepCommonPlace(folded[index->second].change.change.after, each.change.after);
    }
  }
  return folded;
}

}  // namespace SecPolicyTool
