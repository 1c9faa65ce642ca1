// The forms in which a transition graph is given out.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>

#include "tools/graph/transition_graph.h"
#include "tools/policy/terminal.h"

namespace SecPolicyTool {

// For a terminal: a line for each domain and, below it, one for each of its transitions, with the
// place of the rule. Nothing in it can change what a terminal shows but the painter's colours.
TerminalText GraphText(const TransitionGraph& graph, const Painter& painter);

// In the language of Graphviz: a node for each domain, an edge for each link, labelled with its
// transitions; of more than six, with the first six and how many there are besides. Names may hold
// any bytes: they are escaped (see StandIn::Escaped), each domain keeps an identifier of its own,
// and what Graphviz draws is well-formed XML.
std::string GraphDot(const TransitionGraph& graph);

// As docs/schemas/graph.schema.json describes it, without its source.
nlohmann::json GraphJson(const TransitionGraph& graph);

}  // namespace SecPolicyTool
