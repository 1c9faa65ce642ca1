// How one domain is reached from another.
#pragma once

#include <cstddef>
#include <optional>
#include <vector>

#include "tools/graph/transition_graph.h"

namespace SecPolicyTool {

// The domains of a path in their order, as indices of its graph; no domain occurs twice. One domain
// alone is the path from it to itself.
using DomainPath = std::vector<std::size_t>;

struct FoundPaths {
  std::vector<DomainPath> paths;
  bool hasMore = false;  // there are others, as long as the last one or longer
};

// The `most` first paths from `from` to `to`, shortest first, those of equal length in the order of
// their domains' names. The graph is gone over once for each domain of each path found, so that the
// time is bounded however many paths there are.
FoundPaths FindPaths(const TransitionGraph& graph, std::size_t from, std::size_t to,
                     std::size_t most);

// The first of these paths alone; nothing when there is none. Goes over the graph once.
std::optional<DomainPath> ShortestPath(const TransitionGraph& graph, std::size_t from,
                                       std::size_t to);

// The link by which a path goes from its step's domain to the next.
const Link& LinkOf(const TransitionGraph& graph, const DomainPath& path, std::size_t step);

}  // namespace SecPolicyTool
