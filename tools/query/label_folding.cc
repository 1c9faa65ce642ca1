#include "tools/query/label_folding.h"

#include <map>
#include <string_view>
#include <unordered_map>

#include "tools/policy/path_tree.h"

namespace SecPolicyTool {

namespace {

// What is at a path and below it.
struct Tree {
  std::size_t files = 0;
  std::size_t changed = 0;
  const ChangedLabel* first = nullptr;
  bool isAlike = true;  // what has changed has changed like `first`

  // Adds a file and its change, which is nullptr for one that has not changed.
  void Add(const ChangedLabel* change);
  [[nodiscard]] bool IsFolded() const { return files > 1 && changed == files && isAlike; }
};

using Trees = PathTree<Tree>;
using MaybeLabel = std::optional<std::string>;

MaybeLabel LabelOf(const std::optional<LabelledFile>& file) {
  return file ? MaybeLabel(file->label) : std::nullopt;
}

bool IsAlike(const ChangedLabel& one, const ChangedLabel& other) {
  return LabelOf(one.change.before) == LabelOf(other.change.before) &&
         LabelOf(one.change.after) == LabelOf(other.change.after);
}

void Tree::Add(const ChangedLabel* change) {
  ++files;
  if (change == nullptr) return;
  ++changed;
  if (first == nullptr) first = change;
  isAlike = isAlike && IsAlike(*first, *change);
}

Trees TreesOf(const std::vector<ChangedLabel>& changes, const std::vector<std::string>& all) {
  std::map<std::string, const ChangedLabel*> byPath;
  for (const std::string& path : all) byPath[path] = nullptr;
  for (const ChangedLabel& change : changes) byPath[change.name] = &change;
  Trees trees;
  for (const auto& [path, change] : byPath) {
    trees.Visit(path, [&, each = change](Tree& tree, std::string_view) { tree.Add(each); });
  }
  return trees;
}

// The outermost tree to say `path`'s change with; nullptr when the change stands alone.
struct OutermostTree {
  std::string path;
  const Tree* tree = nullptr;
};

OutermostTree OutermostTreeOf(const std::string& path, const Trees& trees) {
  OutermostTree outermost{path};
  trees.VisitKnown(path, [&](const Tree& tree, std::string_view above) {
    if (outermost.tree == nullptr && tree.IsFolded()) outermost = {std::string(above), &tree};
  });
  return outermost;
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
    const auto [top, tree] = OutermostTreeOf(each.name, trees);
    const auto [index, isNew] = indices.emplace(top, folded.size());
    if (isNew) {
      const std::string pattern = top == "/" ? "/*" : top + "/*";
      folded.push_back({tree ? pattern : top, tree ? tree->files : 1, each});
    } else {
      KeepCommonPlace(folded[index->second].change.change.before, each.change.before);
      KeepCommonPlace(folded[index->second].change.change.after, each.change.after);
    }
  }
  return folded;
}

}  // namespace SecPolicyTool
