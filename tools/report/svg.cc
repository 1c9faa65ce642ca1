#include <map>

#include "tools/report/sections.h"

namespace SecPolicyTool {

namespace {

// Beyond that, lines are a texture, and elements a burden.
constexpr std::size_t kMostSeparateLinks = 3000;

std::string Moved(const Point& point, double turn = 0) {
  const std::string moved = "translate(" + SvgNumber(point.x) + " " + SvgNumber(point.y) + ")";
  return turn == 0 ? moved : moved + " rotate(" + SvgNumber(turn) + ")";
}

Html Arrowhead(const char* id) {
  const std::string size = SvgNumber(kArrow);
  return Element("marker",
                 {{"id", id},
                  {"markerWidth", size},
                  {"markerHeight", "8"},
                  {"refY", "4"},
                  {"markerUnits", "userSpaceOnUse"},
                  {"orient", "auto"}},
                 Element("path", {{"d", "M0 0L" + size + " 4L0 8z"}}, {}));
}

// "a to b: label, event; label, event".
std::string Explained(const TransitionGraph& graph, const Link& link) {
  std::string text = graph.Domains()[link.from] + " to " + graph.Domains()[link.to];
  const char* separator = ": ";
  for (const Transition& transition : graph.TransitionsOf(link)) {
    text += separator + transition.label + ", " + transition.event;
    separator = "; ";
  }
  return text;
}

Html LinkHtml(const TransitionGraph& graph, const DrawnLink& drawn) {
  const Link& link = graph.Links()[drawn.link];
  Html content =
      Element("title", Explained(graph, link)) + Element("path", {{"d", drawn.path}}, {});
  if (drawn.caption) {
    content += Element("text", {{"transform", Moved(*drawn.caption)}}, CaptionOf(graph, link));
  }
  return Element("g",
                 {{"class", "link"},
                  {"data-from", std::to_string(link.from)},
                  {"data-to", std::to_string(link.to)}},
                 content);
}

// The links that leave each domain as one path.
Html Texture(const TransitionGraph& graph, const Drawing& drawing) {
  std::map<std::size_t, std::string> paths;
  for (const DrawnLink& drawn : drawing.links) paths[graph.Links()[drawn.link].from] += drawn.path;
  Html texture;
  for (const auto& [from, path] : paths) {
    texture += Element("path", {{"data-from", std::to_string(from)}, {"d", path}}, {});
  }
  return Element("g", {{"class", "texture"}}, texture);
}

Html LinksHtml(const TransitionGraph& graph, const Drawing& drawing) {
  if (drawing.links.size() > kMostSeparateLinks) return Texture(graph, drawing);
  Html links;
  for (const DrawnLink& drawn : drawing.links) links += LinkHtml(graph, drawn);
  return links;
}

Html Box(const DrawnDomain& drawn, const std::string& name) {
  return Element("rect",
                 {{"x", SvgNumber(-drawn.width / 2)},
                  {"y", SvgNumber(-drawn.height / 2)},
                  {"width", SvgNumber(drawn.width)},
                  {"height", SvgNumber(drawn.height)},
                  {"rx", "7"}},
                 {}) +
         Element("text", name);
}

// The name is turned so that it is never upside down.
Html Dot(const DrawnDomain& drawn, const std::string& name) {
  const bool isLeft = drawn.turn > 90;
  return Element("circle", {{"r", "6"}}, {}) +
         Element("text",
                 {{"class", isLeft ? "left" : "right"},
                  {"transform", "rotate(" + SvgNumber(isLeft ? drawn.turn - 180 : drawn.turn) +
                                    ") translate(" + (isLeft ? "-12" : "12") + " 0)"}},
                 name);
}

Html DomainHtml(const ReportContext& context, const DrawnDomain& drawn) {
  const std::string name = DrawnName(context.graph, drawn.domain);
  const std::string& whole = context.graph.Domains()[drawn.domain];
  return Element(
      "a",
      {{"class", "node"},
       {"href", "#" + context.anchors.OfDomain(whole)},
       {"data-domain", std::to_string(drawn.domain)},
       {"transform", Moved(drawn.centre)}},
      Element("title", whole) + (drawn.width == 0 ? Dot(drawn, name) : Box(drawn, name)));
}

}  // namespace

Html DrawingSvg(const ReportContext& context) {
  const Drawing& drawing = context.report.drawing;
  Html content = Element("defs", Arrowhead("arrow") + Arrowhead("arrow-marked"));
  content += LinksHtml(context.graph, drawing);
  for (const DrawnDomain& drawn : drawing.domains) content += DomainHtml(context, drawn);
  const std::string width = SvgNumber(drawing.width);
  const std::string height = SvgNumber(drawing.height);
  return Element("svg",
                 {{"viewBox", "0 0 " + width + " " + height},
                  {"width", width},
                  {"height", height},
                  {"role", "group"},
                  {"aria-label", "Transitions between domains"}},
                 content);
}

}  // namespace SecPolicyTool
