#include "tools/requests/held_json.h"

#include <nlohmann/json.hpp>

#include "secpolicy/secpolicy.h"
#include "tools/kernel/tables.h"
#include "tools/policy/held_policy.h"
#include "tools/query/rule_json.h"

namespace SecPolicyTool {

using nlohmann::json;
using SecPolicy::ZekAccessInterfaceImpl;

namespace {

json DomainsJson(const Policy& policy, const std::optional<unsigned int>& domain,
                 ZekAccessInterfaceImpl& iface) {
  json domains = json::array();
  for (const DomainRow& row : ReadDomains(iface)) {
    if (domain && row.id != *domain) continue;
    json entry = ToJson(row);
    entry["rules"] = json::array();
    for (const PolicyRule& rule : policy.domains.at(row.name).rules) {
      entry["rules"].push_back(RuleJson(rule));
    }
    domains.push_back(std::move(entry));
  }
  return domains;
}

json ObjectsJson(ZekAccessInterfaceImpl& iface) {
  json objects = json::array();
  for (const auto& [name, id] : iface.GetKeywordsMap(ZekCtl::Security::kObjectKeyword)) {
    objects.push_back({{"name", name}, {"id", id}});
  }
  return objects;
}

json TardisksJson(const Policy& policy, const StandIn::ImageIndex& image) {
  json tardisks = json::array();
  for (const StandIn::TardiskContent& tardisk : image.tardisks) {
    const auto labelled = policy.tardisks.find(tardisk.name);
    tardisks.push_back(
        {{"path", std::string(StandIn::kArchivesPath) + "/" + tardisk.name},
         {"label", labelled == policy.tardisks.end() ? kUnlabelled : labelled->second.label}});
  }
  return tardisks;
}

}  // namespace

json HeldJson(StandIn::Kernel& kernel, const std::optional<unsigned int>& domain) {
  const Policy policy = HeldPolicy(kernel);
  const StandIn::ThreadAttachment attachment(kernel.Attachment());
  ZekAccessInterfaceImpl iface;
  return {{"domains", DomainsJson(policy, domain, iface)},
          {"objects", ObjectsJson(iface)},
          {"tardisks", TardisksJson(policy, kernel.Files().Image())}};
}

}  // namespace SecPolicyTool
