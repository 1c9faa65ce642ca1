#include "tools/query/difference_report.h"

#include <nlohmann/json.hpp>
#include "tools/query/rule_json.h"

namespace SecPolicyTool {

using nlohmann::json;

namespace {

const char* NameOf(Change change) {
  static constexpr std::array kNames{"added", "removed", "changed"};
  return kNames.at(static_cast<std::size_t>(change));
}

json ContentJson(const PolicyRule& rule) { return RuleJson(rule); }

json ContentJson(const ObjectContent& object) {
  json entry = json::object();
  AddPlaceJson(object.place, entry);
  return entry;
}

json ContentJson(const LabelledFile& file) {
  json entry{{"label", file.label.empty() ? json() : json(file.label)}};
  AddPlaceJson(file.place, entry);
  return entry;
}

template <typename Content>
json ChangeJson(const Changed<Content>& change) {
  json entry{{"change", NameOf(change.Kind())}};
  if (change.before) entry["before"] = ContentJson(*change.before);
  if (change.after) entry["after"] = ContentJson(*change.after);
  return entry;
}

template <typename Content>
json NamedJson(const std::vector<Named<Content>>& changes, const char* key) {
  json entries = json::array();
  for (const auto& [name, change] : changes) {
    json entry = ChangeJson(change);
    entry[key] = name;
    entries.push_back(std::move(entry));
  }
  return entries;
}

json DomainJson(const ChangedDomain& domain) {
  json rules = json::array();
  for (const ChangedRule& rule : domain.rules) rules.push_back(ChangeJson(rule));
  return {{"name", domain.name}, {"change", NameOf(domain.kind)}, {"rules", std::move(rules)}};
}

}  // namespace

json DifferenceJson(const Difference& difference) {
  json domains = json::array();
  for (const ChangedDomain& domain : difference.domains) domains.push_back(DomainJson(domain));
  return {{"domains", std::move(domains)},
          {"objects", NamedJson(difference.objects, "name")},
          {"tardisks", NamedJson(difference.tardisks, "name")},
          {"files", NamedJson(difference.files, "path")}};
}

}  // namespace SecPolicyTool
