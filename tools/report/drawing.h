// Where the domains and transitions of a graph are drawn.
#pragma once

#include <cstddef>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "tools/graph/transition_graph.h"

namespace SecPolicyTool {

// In pixels, from the upper left corner.
struct Point {
  double x = 0;
  double y = 0;
};

struct DrawnDomain {
  std::size_t domain = 0;  // of the graph
  Point centre;
  // Of the box that holds its name; 0 for a dot, beside which the name stands, away from the
  // middle.
  double width = 0;
  double height = 0;
  double turn = 0;  // of a dot's name, in degrees, clockwise
};

struct DrawnLink {
  std::size_t link = 0;          // of the graph
  std::string path;              // as SVG has it; ends so that an arrowhead of kArrow has room
  std::optional<Point> caption;  // the middle of its caption; nothing when it has none
};

struct Drawing {
  double width = 0;
  double height = 0;
  std::vector<DrawnDomain> domains;  // those that a link leaves or enters
  std::vector<DrawnLink> links;
};

// The length of an arrowhead.
inline constexpr double kArrow = 9;

// The names and captions that a drawing has room for.
std::string DrawnName(const TransitionGraph& graph, std::size_t domain);
std::string CaptionOf(const TransitionGraph& graph, const Link& link);

// Laid out by Graphviz, which gets to see numbers only. Throws as RunGraphviz does.
Drawing DrawWithGraphviz(const TransitionGraph& graph);

// All domains on a circle.
Drawing DrawCircle(const TransitionGraph& graph);

// With Graphviz, unless there is too much for it to lay out; else, and when Graphviz is not there
// or fails, on a circle. `warn` is told how it failed.
Drawing Draw(const TransitionGraph& graph, const std::function<void(const std::string&)>& warn);

// A number as SVG has it.
std::string SvgNumber(double number);

// The domains that links leave or enter, and the others.
struct LinkedDomains {
  std::vector<std::size_t> linked;
  std::vector<std::size_t> alone;
};
LinkedDomains SplitDomains(const TransitionGraph& graph);

}  // namespace SecPolicyTool
