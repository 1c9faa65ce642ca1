#include <sstream>
#include <stdexcept>

#include "host/text/utf8_text.h"
#include "tools/graph/graphviz.h"
#include "tools/report/drawing.h"

namespace SecPolicyTool {

namespace {

// Graphviz counts in inches, of which it takes 72 points to be one.
constexpr double kPoints = 72;
constexpr double kMargin = 12;
constexpr double kBoxHeight = 32;

// Beyond that, captions cover one another, and laying them out takes many seconds.
constexpr std::size_t kMostCaptions = 100;
bool HasCaptions(const TransitionGraph& graph) { return graph.Links().size() <= kMostCaptions; }

// Of a character of a name, and of one of a caption.
constexpr double kNameWidth = 7.6;
constexpr double kCaptionWidth = 6.2;

double BoxWidth(const TransitionGraph& graph, std::size_t domain) {
  return static_cast<double>(StandIn::CharacterCount(DrawnName(graph, domain))) * kNameWidth + 28;
}

// A table of one cell is a caption of a size that no font has a say in.
std::string CaptionBox(const TransitionGraph& graph, const Link& link) {
  const auto characters = static_cast<double>(StandIn::CharacterCount(CaptionOf(graph, link)));
  return R"(<<table border="0" fixedsize="true" height="16" width=")" +
         std::to_string(static_cast<int>(characters * kCaptionWidth + 10)) +
         R"("><tr><td></td></tr></table>>)";
}

// The graph without its words.
std::string Skeleton(const TransitionGraph& graph) {
  std::string dot =
      "digraph { rankdir=LR; nodesep=0.22; ranksep=0.5; nslimit=1; nslimit1=1; mclimit=0.3;\n"
      "node [shape=box, fixedsize=true, label=\"\", height=" +
      SvgNumber(kBoxHeight / kPoints) + "];\n";
  for (const std::size_t domain : SplitDomains(graph).linked) {
    dot += std::to_string(domain) + " [width=" + std::to_string(BoxWidth(graph, domain) / kPoints) +
           "];\n";
  }
  for (const Link& link : graph.Links()) {
    dot += std::to_string(link.from) + " -> " + std::to_string(link.to) +
           (HasCaptions(graph) ? " [label=" + CaptionBox(graph, link) + "]" : "") + ";\n";
  }
  return dot + "}\n";
}

// Reads what Graphviz calls its plain format: lines of words.
class PlainReader {
 public:
  explicit PlainReader(const TransitionGraph& graph) : graph_(graph) {}

  Drawing Read(const std::string& text) {
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
      std::istringstream words(line);
      std::string kind;
      words >> kind;
      if (kind == "graph") ReadSize(words);
      if (kind == "node") ReadNode(words);
      if (kind == "edge") ReadEdge(words);
      if (!words) throw std::runtime_error("Graphviz failed: it answered \"" + line + "\"");
    }
    return std::move(drawing_);
  }

 private:
  void ReadSize(std::istream& words) {
    double scale = 0;
    words >> scale >> drawing_.width >> drawing_.height;
    drawing_.width = drawing_.width * kPoints + 2 * kMargin;
    drawing_.height = drawing_.height * kPoints + 2 * kMargin;
  }

  Point ReadPoint(std::istream& words) const {
    Point point;
    words >> point.x >> point.y;
    return {point.x * kPoints + kMargin, drawing_.height - kMargin - point.y * kPoints};
  }

  void ReadNode(std::istream& words) {
    DrawnDomain drawn;
    words >> drawn.domain;
    drawn.centre = ReadPoint(words);
    if (drawn.domain >= graph_.Domains().size()) words.setstate(std::ios::failbit);
    if (!words) return;
    drawn.width = BoxWidth(graph_, drawn.domain);
    drawn.height = kBoxHeight;
    drawing_.domains.push_back(drawn);
  }

  // The spline's first point, then three for each of its pieces.
  void ReadEdge(std::istream& words) {
    std::size_t from = 0;
    std::size_t to = 0;
    std::size_t points = 0;
    words >> from >> to >> points;
    DrawnLink drawn{IndexOf(from, to), "", std::nullopt};
    for (std::size_t i = 0; i < points && words; ++i) {
      const Point point = ReadPoint(words);
      drawn.path += (i == 0   ? "M"
                     : i == 1 ? "C"
                              : " ") +
                    SvgNumber(point.x) + " " + SvgNumber(point.y);
    }
    if (HasCaptions(graph_)) {
      std::string caption;
      words >> caption;
      drawn.caption = ReadPoint(words);
    }
    if (drawn.link == graph_.Links().size()) words.setstate(std::ios::failbit);
    drawing_.links.push_back(std::move(drawn));
  }

  // The number of links when there is none.
  [[nodiscard]] std::size_t IndexOf(std::size_t from, std::size_t to) const {
    if (from < graph_.Domains().size()) {
      for (const Link& link : graph_.LinksFrom(from)) {
        if (link.to == to) return static_cast<std::size_t>(&link - graph_.Links().data());
      }
    }
    return graph_.Links().size();
  }

  const TransitionGraph& graph_;
  Drawing drawing_;
};

}  // namespace

Drawing DrawWithGraphviz(const TransitionGraph& graph) {
  return PlainReader(graph).Read(RunGraphviz(Skeleton(graph), "plain"));
}

}  // namespace SecPolicyTool
