#include "tools/query/reach.h"

#include "tools/graph/domain_paths.h"

namespace SecPolicyTool {

std::optional<std::vector<Step>> Ways::Shortest(const std::string& from, const std::string& to,
                                                const std::optional<std::string>& event) {
  const TransitionGraph& graph = graphs_.try_emplace(event, policy_, event).first->second;
  const auto begin = graph.Find(from);
  const auto end = graph.Find(to);
  if (!begin || !end) return std::nullopt;
  const auto path = ShortestPath(graph, *begin, *end);
  if (!path) return std::nullopt;
  std::vector<Step> way;
  for (std::size_t step = 0; step + 1 < path->size(); ++step) {
    const Transition& first = graph.TransitionsOf(LinkOf(graph, *path, step)).front();
    way.push_back({&policy_.domains.find(graph.Domains()[first.from])->first, first.rule});
  }
  return way;
}

}  // namespace SecPolicyTool
