#include "tools/report/drawing.h"

#include <array>
#include <charconv>

#include "host/text/escaped.h"
#include "host/text/utf8_text.h"

namespace SecPolicyTool {

namespace {

constexpr std::size_t kLongestName = 26;

}  // namespace

std::string DrawnName(const TransitionGraph& graph, std::size_t domain) {
  return StandIn::Shortened(StandIn::Escaped(graph.Domains()[domain]).Text(), kLongestName);
}

std::string CaptionOf(const TransitionGraph& graph, const Link& link) {
  const Transition& first = graph.TransitionsOf(link).front();
  const std::string caption =
      StandIn::Shortened(StandIn::Escaped(first.label).Text(), kLongestName) + ", " +
      StandIn::Escaped(first.event).Text();
  return link.count == 1 ? caption : caption + " +" + std::to_string(link.count - 1);
}

std::string SvgNumber(double number) {
  std::array<char, 64> text{};
  const auto end = std::to_chars(text.begin(), text.end(), number, std::chars_format::fixed, 1).ptr;
  return {text.begin(), end};
}

LinkedDomains SplitDomains(const TransitionGraph& graph) {
  std::vector<bool> isLinked(graph.Domains().size());
  for (const Link& link : graph.Links()) isLinked[link.from] = isLinked[link.to] = true;
  LinkedDomains domains;
  for (std::size_t domain = 0; domain < isLinked.size(); ++domain) {
    (isLinked[domain] ? domains.linked : domains.alone).push_back(domain);
  }
  return domains;
}

}  // namespace SecPolicyTool
