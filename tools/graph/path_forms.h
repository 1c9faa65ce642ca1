// What is asked about paths between domains, and the forms in which the answer is given out.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <optional>
#include <string>

#include "tools/graph/domain_paths.h"
#include "tools/graph/transition_graph.h"
#include "tools/policy/terminal.h"

namespace SecPolicyTool {

struct PathQuestion {
  std::size_t from = 0;
  std::size_t to = 0;
  std::optional<std::string> event;  // the only one that the graph holds, if it is so
};

// The index of the domain `name`. Throws std::runtime_error `unknown domain "NAME" (nearest:
// OTHER)`, without the bracket when none is near.
std::size_t RequireDomain(const TransitionGraph& graph, const std::string& name);

// For a terminal: each path with its steps, each step with the rules that allow it and their
// places; or "TO is not reached from FROM".
TerminalText PathsText(const TransitionGraph& graph, const PathQuestion& question,
                       const FoundPaths& found, const Painter& painter);

// As docs/schemas/paths.schema.json describes it.
nlohmann::json PathsJson(const TransitionGraph& graph, const PathQuestion& question,
                         const FoundPaths& found);

}  // namespace SecPolicyTool
