#include <map>
#include <set>

#include "tools/report/sections.h"

namespace SecPolicyTool {

namespace {

constexpr std::size_t kMostOpenRules = 60;

using RulesByType = std::map<RuleType, std::vector<const PolicyRule*>>;

RulesByType ByType(const DomainContent& domain) {
  RulesByType rules;
  for (const PolicyRule& rule : domain.rules) rules[rule.key.type].push_back(&rule);
  return rules;
}

// The rule as its line, with links to the labels and the domain that it names.
Html RuleLine(const Anchors& anchors, const PolicyRule& rule) {
  Html line = InfoOf(rule.key.type).keyword;
  for (std::size_t word = 0; word < rule.key.words.size(); ++word) {
    const std::string& text = rule.key.words[word];
    const bool isDomain = InfoOf(rule.key.type).DomainWord() == word;
    line += " " + (isDomain                       ? anchors.Domain(text)
                   : IsLabel(rule.key.type, word) ? anchors.Label(text)
                                                  : Html(text));
  }
  const std::string decision = DecisionOf(rule);
  if (!decision.empty()) line += " " + decision;
  if (rule.key.world != 0) line += " # world " + std::to_string(rule.key.world);
  return line;
}

// What takes something away is set apart.
bool IsRefusal(const PolicyRule& rule) {
  return InfoOf(rule.key.type).HasDecision() ? !rule.isGranted : rule.permission == 0;
}

Html RuleHtml(const Anchors& anchors, const PolicyRule& rule, const std::string& file) {
  const Html content = Element("code", RuleLine(anchors, rule)) + " " + PlaceHtml(rule.place, file);
  return IsRefusal(rule) ? Element("li", {{"class", "no"}}, content) : Element("li", content);
}

Html GroupHtml(const Anchors& anchors, RuleType type, const std::vector<const PolicyRule*>& rules,
               const std::string& file) {
  Html lines;
  for (const PolicyRule* rule : rules) lines += RuleHtml(anchors, *rule, file);
  std::vector<Attribute> attributes{{"class", "group"}};
  if (rules.size() <= kMostOpenRules) attributes.push_back({"open", ""});
  const RuleTypeInfo& info = InfoOf(type);
  return Element(
      "details", attributes,
      Element("summary", info.name + (" " + Element("code", info.keyword)) + " " +
                             Element("span", {{"class", "count"}}, std::to_string(rules.size()))) +
          Element("ul", {{"class", "rules"}}, lines));
}

// A count for each type of rule, in columns; types without a rule leave theirs empty.
Html CountsHtml(const RulesByType& rules) {
  Html counts;
  for (const RuleTypeInfo& info : kRuleTypes) {
    const auto found = rules.find(info.type);
    if (found == rules.end()) {
      counts += Element("i", {});
      continue;
    }
    const std::string title = Counted(found->second.size(), std::string(info.name) + " rule");
    counts += Element("span", {{"title", title}},
                      Element("small", info.keyword) + " " + std::to_string(found->second.size()));
  }
  return Element("span", {{"class", "counts"}}, counts);
}

Html NamesHtml(const ReportContext& context, const char* title,
               const std::vector<std::size_t>& domains) {
  Html names;
  for (const std::size_t domain : domains) {
    names += Element("li", context.anchors.Domain(context.graph.Domains()[domain]));
  }
  if (names.IsEmpty()) names = Element("li", {{"class", "none"}}, "none");
  return Element("div", {{"class", "ways"}},
                 Element("b", title) + Element("ul", {{"class", "names"}}, names));
}

// By domain: those from which links lead to it.
std::vector<std::vector<std::size_t>> SourcesOf(const TransitionGraph& graph) {
  std::vector<std::vector<std::size_t>> sources(graph.Domains().size());
  for (const Link& link : graph.Links()) sources[link.to].push_back(link.from);
  return sources;
}

Html DomainHtml(const ReportContext& context, std::size_t number, const DomainContent& domain,
                const std::vector<std::size_t>& sources) {
  const std::string& name = context.graph.Domains()[number];
  std::vector<std::size_t> targets;
  for (const Link& link : context.graph.LinksFrom(number)) targets.push_back(link.to);
  const RulesByType rules = ByType(domain);
  const std::string file = domain.place ? domain.place->file : "";
  Html content = PlaceHtml(domain.place) + NamesHtml(context, "Reached from", sources) +
                 NamesHtml(context, "Goes to", targets);
  for (const auto& [type, list] : rules) content += GroupHtml(context.anchors, type, list, file);
  if (rules.empty()) content += Element("p", "No rules.");
  return Entry(context.anchors.OfDomain(name), Element("h3", name) + " " + CountsHtml(rules),
               content);
}

}  // namespace

Html DomainsSection(const ReportContext& context) {
  static const DomainContent kNothing;
  const auto sources = SourcesOf(context.graph);
  const auto& domains = context.report.policy.domains;
  Html entries;
  for (std::size_t i = 0; i < context.graph.Domains().size(); ++i) {
    const auto domain = domains.find(context.graph.Domains()[i]);
    entries +=
        DomainHtml(context, i, domain == domains.end() ? kNothing : domain->second, sources[i]);
  }
  return Section("domains", "Domains", entries);
}

}  // namespace SecPolicyTool
