#include "tools/report/sections.h"

namespace SecPolicyTool {

namespace {

constexpr double kPageWidth = 1220;
constexpr double kPageHeight = 1600;

// A drawing that is bigger than a page is fitted into one unless this is switched on.
Html SizeSwitch(const Drawing& drawing) {
  if (drawing.width <= kPageWidth && drawing.height <= kPageHeight) return {};
  return Element("label", {{"class", "size"}},
                 VoidElement("input", {{"type", "checkbox"}}) + " Full size");
}

Html DrawingHtml(const ReportContext& context) {
  return SizeSwitch(context.report.drawing) + Element("div",
                                                      {{"class", "drawing"},
                                                       {"role", "region"},
                                                       {"aria-label", "Drawing of the transitions"},
                                                       {"tabindex", "0"}},
                                                      DrawingSvg(context));
}

Html Loners(const ReportContext& context) {
  Html names;
  for (const std::size_t domain : SplitDomains(context.graph).alone) {
    names += Element("li", context.anchors.Domain(context.graph.Domains()[domain]));
  }
  if (names.IsEmpty()) return {};
  return Element("p", "Without a transition:") + Element("ul", {{"class", "names"}}, names);
}

}  // namespace

Html GraphSection(const ReportContext& context) {
  const bool isEmpty = context.report.drawing.links.empty();
  return Section("graph", "Transitions",
                 (isEmpty ? Element("p", "No domain goes to another.")
                          : Element("p", {{"class", "hint"}},
                                    "An arrow is a granted transition: the program of one domain "
                                    "goes to the other when the event happens to something with "
                                    "the label.") +
                                DrawingHtml(context)) +
                     Loners(context));
}

}  // namespace SecPolicyTool
