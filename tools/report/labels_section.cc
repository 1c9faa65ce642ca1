#include <map>

#include "tools/report/sections.h"

namespace SecPolicyTool {

namespace {

struct LabelUse {
  // By the names of their domains.
  std::map<std::string, std::vector<const PolicyRule*>> rules;
  std::size_t ruleCount = 0;
  std::size_t fileCount = 0;
  std::vector<std::string> tardisks;
};
using LabelUses = std::map<std::string, LabelUse>;

void AddRule(const std::string& domain, const PolicyRule& rule, LabelUses& uses) {
  std::string last;
  for (std::size_t word = 0; word < rule.key.words.size(); ++word) {
    const std::string& label = rule.key.words[word];
    if (!IsLabel(rule.key.type, word) || label == last) continue;
    uses[label].rules[domain].push_back(&rule);
    ++uses[label].ruleCount;
    last = label;
  }
}

LabelUses UsesOf(const Policy& policy) {
  LabelUses uses;
  for (const auto& [name, domain] : policy.domains) {
    for (const PolicyRule& rule : domain.rules) AddRule(name, rule, uses);
  }
  for (const auto& [path, file] : policy.files) ++uses[file.label].fileCount;
  for (const auto& [name, tardisk] : policy.tardisks) uses[tardisk.label].tardisks.push_back(name);
  return uses;
}

Html RulesHtml(const Anchors& anchors, const LabelUse& use) {
  Html domains;
  for (const auto& [name, rules] : use.rules) {
    Html lines;
    for (const PolicyRule* rule : rules) lines += " " + Element("code", LineOf(*rule));
    domains += Element("li", anchors.Domain(name) + lines);
  }
  return domains.IsEmpty() ? Html() : Element("ul", {{"class", "rules uses"}}, domains);
}

Html ObjectState(const Policy& policy, const std::string& label) {
  const auto object = policy.objects.find(label);
  if (object == policy.objects.end()) return Element("p", "No object has this name.");
  if (object->second.isPredefined) return Element("p", "Predefined by the kernel.");
  return PlaceHtml(object->second.place);
}

// "3 rules, 2 files", and nothing of what there is none of.
std::string Summary(const LabelUse& use) {
  std::string summary;
  const auto add = [&](std::size_t count, const char* what) {
    if (count != 0) summary += (summary.empty() ? "" : ", ") + Counted(count, what);
  };
  add(use.ruleCount, "rule");
  add(use.fileCount, "file");
  add(use.tardisks.size(), "tardisk");
  return summary.empty() ? "not used" : summary;
}

Html LabelHtml(const ReportContext& context, const std::string& label, const LabelUse& use) {
  Html content = ObjectState(context.report.policy, label);
  if (use.fileCount != 0) {
    content += Element("p", Element("a", {{"href", "#" + context.anchors.OfFiles(label)}},
                                    "Carried by " + Counted(use.fileCount, "file")));
  }
  for (const std::string& tardisk : use.tardisks) {
    content += Element("p", "Carried by the tardisk " + Element("code", tardisk));
  }
  return Entry(context.anchors.OfLabel(label),
               Element("h3", label) + " " + Element("span", {{"class", "count"}}, Summary(use)),
               content + RulesHtml(context.anchors, use));
}

}  // namespace

Html LabelsSection(const ReportContext& context) {
  LabelUses uses = UsesOf(context.report.policy);
  Html entries;
  for (const auto& [label, number] : context.anchors.Labels()) {
    entries += LabelHtml(context, label, uses[label]);
  }
  return Section("labels", "Labels", entries);
}

}  // namespace SecPolicyTool
