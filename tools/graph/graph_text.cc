#include <algorithm>
#include <vector>

#include "tools/graph/graph_forms.h"

namespace SecPolicyTool {

namespace {

// "  --label,event--> target" and the place.
struct Row {
  TerminalText transition;
  TerminalText place;
};

std::vector<Row> RowsOf(const TransitionGraph& graph, std::size_t domain) {
  std::vector<Row> rows;
  for (const Link& link : graph.LinksFrom(domain)) {
    for (const Transition& transition : graph.TransitionsOf(link)) {
      rows.push_back(
          {"--" + transition.label + "," + transition.event + "--> " + graph.Domains()[link.to],
           PlaceText(transition.place)});
    }
  }
  return rows;
}

std::size_t WidthOf(const std::vector<Row>& rows) {
  std::size_t width = 0;
  for (const Row& row : rows) width = std::max(width, row.transition.Text().size());
  return width;
}

}  // namespace

TerminalText GraphText(const TransitionGraph& graph, const Painter& painter) {
  TerminalText text;
  for (std::size_t domain = 0; domain < graph.Domains().size(); ++domain) {
    const std::vector<Row> rows = RowsOf(graph, domain);
    text += painter.Paint(Colour::kBold, graph.Domains()[domain]);
    if (rows.empty()) text += " (no transitions)";
    text.EndLine();
    const std::size_t width = WidthOf(rows);
    for (const Row& row : rows) {
      const std::string gap(width - row.transition.Text().size() + 2, ' ');
      text += "  " + row.transition + gap + painter.Paint(Colour::kCyan, row.place);
      text.EndLine();
    }
  }
  return text;
}

}  // namespace SecPolicyTool
