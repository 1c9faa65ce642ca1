#include <algorithm>
#include <string_view>

#include "host/text/escaped.h"
#include "host/text/utf8_text.h"
#include "tools/graph/graph_forms.h"

namespace SecPolicyTool {

namespace {

constexpr std::size_t kMostLabels = 6;

// Bytes of a quoted identifier. Only a quotation mark ends it, and a backslash before one does not;
// an entity has the character's meaning in a drawing's titles.
void AppendQuoted(std::string& quoted, std::string_view text) {
  for (const char c : text) {
    if (c == '"' || c == '\\') quoted += '\\';
    quoted += c == '&' ? "&amp;" : std::string(1, c);
  }
}

// An identifier that stands for `text` alone: a backslash of the text is doubled, one of an escape
// is not.
std::string Quoted(std::string_view text) {
  std::string quoted = "\"";
  // At the beginning, it marks names that Graphviz gives itself.
  if (text.starts_with('%')) {
    StandIn::AppendEscaped(quoted, text.front());
    text.remove_prefix(1);
  }
  while (!text.empty()) {
    const std::size_t bytes = std::max<std::size_t>(1, StandIn::CharacterBytes(text));
    const std::string_view character = text.substr(0, bytes);
    const std::string escaped = StandIn::Escaped(character).Text();
    if (escaped == character) {
      AppendQuoted(quoted, character);
    } else {
      quoted += escaped;
    }
    text.remove_prefix(bytes);
  }
  return quoted + '"';
}

// What a label shows as `text`: labels have escapes and entities of their own.
std::string LabelText(const std::string& text) {
  std::string label;
  for (const char c : StandIn::Escaped(text).Text()) {
    if (c == '"' || c == '\\') label += '\\';
    label += c == '&' ? "&amp;" : std::string(1, c);
  }
  return label;
}

std::string NodeLine(const std::string& domain) {
  const std::string id = Quoted(domain);
  const std::string label = '"' + LabelText(domain) + '"';
  return "  " + id + (label == id ? "" : " [label=" + label + "]") + ";\n";
}

std::string EdgeLabel(const std::span<const Transition>& transitions) {
  std::string label;
  for (std::size_t i = 0; i < transitions.size() && i < kMostLabels; ++i) {
    label += (i == 0 ? "" : "\\n") + LabelText(transitions[i].label + ", " + transitions[i].event);
  }
  if (transitions.size() <= kMostLabels) return label;
  return label + "\\nand " + std::to_string(transitions.size() - kMostLabels) + " more";
}

}  // namespace

std::string GraphDot(const TransitionGraph& graph) {
  std::string text =
      "digraph policy {\n"
      "  rankdir=LR;\n"
      "  node [shape=box, style=rounded, fontname=\"sans-serif\"];\n"
      "  edge [fontname=\"sans-serif\", fontsize=10];\n";
  for (const std::string& domain : graph.Domains()) text += NodeLine(domain);
  for (const Link& link : graph.Links()) {
    text += "  " + Quoted(graph.Domains()[link.from]) + " -> " + Quoted(graph.Domains()[link.to]) +
            " [label=\"" + EdgeLabel(graph.TransitionsOf(link)) + "\"];\n";
  }
  return text + "}\n";
}

}  // namespace SecPolicyTool
