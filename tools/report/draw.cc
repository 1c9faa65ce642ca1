#include <stdexcept>

#include "tools/graph/graphviz.h"
#include "tools/report/drawing.h"

namespace SecPolicyTool {

namespace {

// Beyond that, Graphviz may take minutes for a drawing in which nobody finds anything.
constexpr std::size_t kMostDomains = 150;
constexpr std::size_t kMostLinks = 250;

}  // namespace

Drawing Draw(const TransitionGraph& graph, const std::function<void(const std::string&)>& warn) {
  if (graph.Links().empty()) return {};
  const std::size_t domains = SplitDomains(graph).linked.size();
  if (domains > kMostDomains || graph.Links().size() > kMostLinks) return DrawCircle(graph);
  try {
    return DrawWithGraphviz(graph);
  } catch (const GraphvizMissing&) {
    return DrawCircle(graph);
  } catch (const std::runtime_error& failure) {
    warn(failure.what());
    return DrawCircle(graph);
  }
}

}  // namespace SecPolicyTool
