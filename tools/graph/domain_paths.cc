#include "tools/graph/domain_paths.h"

#include <algorithm>
#include <limits>
#include <set>

namespace SecPolicyTool {

namespace {

constexpr std::size_t kUnreached = std::numeric_limits<std::size_t>::max();

// Finds best paths on which parts of the graph are closed.
class Search {
 public:
  Search(const TransitionGraph& graph, std::size_t to)
      : graph_(graph), to_(to), sources_(graph.Domains().size()) {
    for (const Link& link : graph.Links()) sources_[link.to].push_back(link.from);
  }

  // The shortest continuation of `root`, the first by names of several; it enters none of the
  // domains of `root` again, and does not go on to one of `closed` first.
  [[nodiscard]] std::optional<DomainPath> Continue(const DomainPath& root,
                                                   const std::set<std::size_t>& closed) const {
    const std::vector<std::size_t> distances = Distances(root);
    DomainPath path = root;
    while (path.back() != to_) {
      const auto next = Next(path, distances, path.size() == root.size() ? closed : kOpen);
      if (!next) return std::nullopt;
      path.push_back(*next);
    }
    return path;
  }

 private:
  inline static const std::set<std::size_t> kOpen{};

  // From each domain outside of `root` to the end, by the number of steps.
  [[nodiscard]] std::vector<std::size_t> Distances(const DomainPath& root) const {
    std::vector<std::size_t> distances(sources_.size(), kUnreached);
    std::vector<bool> isClosed(sources_.size());
    for (const std::size_t domain : root) isClosed[domain] = true;
    if (isClosed[to_]) return distances;
    std::vector<std::size_t> queue{to_};
    distances[to_] = 0;
    for (std::size_t i = 0; i < queue.size(); ++i) {
      for (const std::size_t source : sources_[queue[i]]) {
        if (isClosed[source] || distances[source] != kUnreached) continue;
        distances[source] = distances[queue[i]] + 1;
        queue.push_back(source);
      }
    }
    return distances;
  }

  // Where to go on from the path's end: nearest to the end first, then by name.
  [[nodiscard]] std::optional<std::size_t> Next(const DomainPath& path,
                                                const std::vector<std::size_t>& distances,
                                                const std::set<std::size_t>& closed) const {
    std::optional<std::size_t> best;
    for (const Link& link : graph_.LinksFrom(path.back())) {
      if (distances[link.to] == kUnreached || closed.contains(link.to)) continue;
      if (!best || distances[link.to] < distances[*best]) best = link.to;
    }
    return best;
  }

  const TransitionGraph& graph_;
  std::size_t to_;
  std::vector<std::vector<std::size_t>> sources_;  // of the links into each domain
};

// A path, and what of it others may share: those that leave it at `leaves` or later, and there not
// to `closed`.
struct Candidate {
  DomainPath path;
  std::size_t leaves = 0;
  std::set<std::size_t> closed;

  bool operator<(const Candidate& other) const {
    if (path.size() != other.path.size()) return path.size() < other.path.size();
    return path < other.path;
  }
};

// Splits what is left of the candidate's share, its own path taken out, at each domain where
// another path may leave it: no path belongs to two parts, and none to no part.
void AddOthers(const Search& search, const Candidate& taken, std::set<Candidate>& candidates) {
  for (std::size_t leaves = taken.leaves; leaves + 1 < taken.path.size(); ++leaves) {
    std::set<std::size_t> closed;
    if (leaves == taken.leaves) closed = taken.closed;
    closed.insert(taken.path[leaves + 1]);
    const auto end = taken.path.begin() + static_cast<std::ptrdiff_t>(leaves) + 1;
    auto path = search.Continue(DomainPath(taken.path.begin(), end), closed);
    if (path) candidates.insert({*std::move(path), leaves, std::move(closed)});
  }
}

}  // namespace

FoundPaths FindPaths(const TransitionGraph& graph, std::size_t from, std::size_t to,
                     std::size_t most) {
  const Search search(graph, to);
  std::set<Candidate> candidates;
  if (auto first = search.Continue({from}, {})) candidates.insert({*std::move(first), 0, {}});
  FoundPaths found;
  while (!candidates.empty() && found.paths.size() < most) {
    const Candidate best = std::move(candidates.extract(candidates.begin()).value());
    found.paths.push_back(best.path);
    AddOthers(search, best, candidates);
  }
  found.hasMore = !candidates.empty();
  return found;
}

std::optional<DomainPath> ShortestPath(const TransitionGraph& graph, std::size_t from,
                                       std::size_t to) {
  return Search(graph, to).Continue({from}, {});
}

const Link& LinkOf(const TransitionGraph& graph, const DomainPath& path, std::size_t step) {
  const auto links = graph.LinksFrom(path.at(step));
  return *std::lower_bound(links.begin(), links.end(), path.at(step + 1),
                           [](const Link& link, std::size_t to) { return link.to < to; });
}

}  // namespace SecPolicyTool
