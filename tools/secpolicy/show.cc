// secpolicy show [--host DIR] [DOMAIN-ID]
#include <memory>
#include <optional>
#include <stdexcept>

#include "secpolicy/secpolicy.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/host_use.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct ShowArguments {
  std::string host;
  std::optional<unsigned int> domain;
};

// DisplayPolicy prints nothing for an unknown id, which would pass for a domain without rules.
void RequireDomain(StandIn::SecurityModule& module, unsigned int domain) {
  if (!module.GetDomainInfo(domain)) {
    throw std::runtime_error("no domain has the id " + std::to_string(domain));
  }
}

void Show(const ShowArguments& arguments) {
  const auto session = EnterHost(arguments.host);
  if (arguments.domain) RequireDomain(session->Module(), *arguments.domain);
  SecPolicy::DisplayPolicy(arguments.domain ? std::to_string(*arguments.domain) : "");
}

}  // namespace

void AddShow(CLI::App& app, ExitStatus&) {
  CLI::App* verb = app.add_subcommand("show", "Print the policy that a host's kernel holds");
  const auto arguments = std::make_shared<ShowArguments>();
  AddHostOption(*verb, arguments->host);
  verb->add_option("DOMAIN-ID", arguments->domain, "The one domain to show; without it, all");
  verb->callback([arguments] { Show(*arguments); });
}

}  // namespace SecPolicyTool
