#include "tools/policy/policy_json.h"

#include <nlohmann/json.hpp>

namespace SecPolicyTool {

using nlohmann::json;

namespace {

json ToJson(const PolicyRule& rule) {
  return {InfoOf(rule.key.type).keyword,
          rule.key.words,
          rule.key.world,
          rule.isGranted,
          rule.permission,
          ToJson(rule.place)};
}

PolicyRule RuleOfJson(const json& entry) {
  PolicyRule rule;
  rule.key.type = TypeOfKeyword(entry.at(0).get<std::string>()).value();
  rule.key.words = entry.at(1).get<std::vector<std::string>>();
  rule.key.world = entry.at(2).get<StandIn::WorldId>();
  rule.isGranted = entry.at(3).get<bool>();
  rule.permission = entry.at(4).get<std::uint32_t>();
  rule.place = PlaceOfJson(entry.at(5));
  return rule;
}

json FilesToJson(const std::map<std::string, LabelledFile>& files) {
  json entries = json::array();
  for (const auto& [path, file] : files) {
    entries.push_back({path, file.label, ToJson(file.place)});
  }
  return entries;
}

std::map<std::string, LabelledFile> FilesOfJson(const json& entries) {
  std::map<std::string, LabelledFile> files;
  for (const json& entry : entries) {
    files[entry.at(0)] = {entry.at(1).get<std::string>(), PlaceOfJson(entry.at(2))};
  }
  return files;
}

json DomainsToJson(const Policy& policy) {
  json domains = json::array();
  for (const auto& [name, domain] : policy.domains) {
    json rules = json::array();
    for (const PolicyRule& rule : domain.rules) rules.push_back(ToJson(rule));
    domains.push_back({name, ToJson(domain.place), std::move(rules)});
  }
  return domains;
}

json ObjectsToJson(const Policy& policy) {
  json objects = json::array();
  for (const auto& [name, object] : policy.objects) {
    objects.push_back({name, object.isPredefined, ToJson(object.place)});
  }
  return objects;
}

}  // namespace

json ToJson(const std::optional<Place>& place) {
  if (!place) return nullptr;
  json entry{{"file", place->file}};
  if (place->line != 0) entry["line"] = place->line;
  if (place->column != 0) entry["column"] = place->column;
  return entry;
}

std::optional<Place> PlaceOfJson(const json& entry) {
  if (entry.is_null()) return std::nullopt;
  return Place{entry.at("file"), entry.value("line", 0U), entry.value("column", 0U)};
}

json ToJson(const Policy& policy) {
  const HostWords& words = policy.words;
  return {{"domains", DomainsToJson(policy)},
          {"objects", ObjectsToJson(policy)},
          {"files", FilesToJson(policy.files)},
          {"tardisks", FilesToJson(policy.tardisks)},
          {"words",
           {words.launchDomain, words.execEvent, words.defaultTardiskLabel,
            words.defaultTardiskDomain}}};
}

Policy PolicyOfJson(const json& content) {
  Policy policy;
  for (const json& entry : content.at("domains")) {
    DomainContent& domain = policy.domains[entry.at(0)];
    domain.place = PlaceOfJson(entry.at(1));
    for (const json& rule : entry.at(2)) domain.rules.push_back(RuleOfJson(rule));
  }
  for (const json& entry : content.at("objects")) {
    policy.objects[entry.at(0)] = {entry.at(1).get<bool>(), PlaceOfJson(entry.at(2))};
  }
  policy.files = FilesOfJson(content.at("files"));
  policy.tardisks = FilesOfJson(content.at("tardisks"));
  const json& words = content.at("words");
  policy.words = {words.at(0), words.at(1), words.at(2), words.at(3)};
  return policy;
}

}  // namespace SecPolicyTool
