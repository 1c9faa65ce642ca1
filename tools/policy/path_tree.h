// Values by path, found together with those of the directories above.
#pragma once

#include <algorithm>
#include <deque>
#include <map>
#include <string>
#include <string_view>

namespace SecPolicyTool {

// A tree of the components of absolute paths, with a value for each path. A visit of a path and of
// all directories above it takes time in proportion to the path's length; a look-up of each of them
// by its whole path would take that time once for each component.
template <typename Value>
class PathTree {
 public:
  PathTree() : nodes_(1) {}
  PathTree(PathTree&&) noexcept = default;
  PathTree& operator=(PathTree&&) noexcept = default;
  ~PathTree() = default;

  // Calls `use(value, path)` for "/", for each directory on the way to `path`, and for `path`
  // itself. Paths that the tree does not have yet get a default value first. Doubled slashes and
  // one at the end do not count.
  template <typename Use>
  void Visit(std::string_view path, const Use& use) {
    Node* node = &nodes_.front();
    use(node->value, std::string_view("/"));
    ForEachComponent(path, [&](std::string_view name, std::string_view whole) {
      auto below = node->below.find(name);
      if (below == node->below.end()) {
        below = node->below.emplace(name, &nodes_.emplace_back()).first;
      }
      node = below->second;
      use(node->value, whole);
      return true;
    });
  }

  // The same for the paths that the tree has; ends at the first that it does not have.
  template <typename Use>
  void VisitKnown(std::string_view path, const Use& use) const {
    const Node* node = &nodes_.front();
    use(node->value, std::string_view("/"));
    ForEachComponent(path, [&](std::string_view name, std::string_view whole) {
      const auto below = node->below.find(name);
      if (below == node->below.end()) return false;
      node = below->second;
      use(node->value, whole);
      return true;
    });
  }

 private:
  struct Node {
    Value value{};
    std::map<std::string, Node*, std::less<>> below;
  };

  // Hands `use` each component with the path up to it, until it returns false.
  template <typename Use>
  static void ForEachComponent(std::string_view path, const Use& use) {
    for (std::size_t end = 0; end < path.size();) {
      const std::size_t begin = end + 1;
      end = std::min(path.find('/', begin), path.size());
      if (end > begin && !use(path.substr(begin, end - begin), path.substr(0, end))) return;
    }
  }

  // All of them in one sequence, not each within the one above: the end of a deep tree would
  // recurse.
  std::deque<Node> nodes_;
};

}  // namespace SecPolicyTool
