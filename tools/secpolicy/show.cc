// secpolicy show [--host DIR] [--json] [DOMAIN-ID]
#include <memory>
#include <optional>
#include <stdexcept>

#include "secpolicy/secpolicy.h"
#include "tools/kernel/tables.h"
#include "tools/policy/held_policy.h"
#include "tools/policy/output.h"
#include "tools/query/rule_json.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/host_use.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

using nlohmann::json;
using SecPolicy::ZekAccessInterfaceImpl;

namespace {

struct ShowArguments {
  std::string host;
  bool isJson = false;
  std::optional<unsigned int> domain;
};

// DisplayPolicy prints nothing for an unknown id, which would pass for a domain without rules.
void RequireDomain(StandIn::SecurityModule& module, unsigned int domain) {
  if (!module.GetDomainInfo(domain)) {
    throw std::runtime_error("no domain has the id " + std::to_string(domain));
  }
}

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

void PrintPolicy(const ShowArguments& arguments, const StandIn::ImageIndex& image,
                 StandIn::SecurityModule& module) {
  const Policy policy = HeldPolicy(module, image);
  ZekAccessInterfaceImpl iface;
  PrintJson({{"domains", DomainsJson(policy, arguments.domain, iface)},
             {"objects", ObjectsJson(iface)},
             {"tardisks", TardisksJson(policy, image)}});
}

void Show(const ShowArguments& arguments) {
  const StandIn::ImageIndex image = ImageOf(OpenHost(arguments.host));
  StandIn::SessionOptions options;
  options.kernel = StandIn::SessionOptions::Kernel::kSnapshot;
  const auto session = EnterHost(arguments.host, options);
  if (arguments.domain) RequireDomain(session->Module(), *arguments.domain);
  if (arguments.isJson) return PrintPolicy(arguments, image, session->Module());
  SecPolicy::DisplayPolicy(arguments.domain ? std::to_string(*arguments.domain) : "");
}

}  // namespace

void AddShow(CLI::App& app, ExitStatus&) {
  CLI::App* verb = app.add_subcommand("show", "Print the policy that a host's kernel holds");
  const auto arguments = std::make_shared<ShowArguments>();
  AddHostOption(*verb, arguments->host);
  AddJsonOption(*verb, arguments->isJson);
  verb->add_option("DOMAIN-ID", arguments->domain, "The one domain to show; without it, all");
  verb->callback([arguments] { Show(*arguments); });
}

}  // namespace SecPolicyTool
