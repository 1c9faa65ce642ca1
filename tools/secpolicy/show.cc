// secpolicy show [--host DIR] [--json] [DOMAIN-ID]
#include <limits>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <stdexcept>

#include "secpolicy/secpolicy.h"
#include "tools/policy/output.h"
#include "tools/requests/held_json.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/host_use.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

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

ExitStatus Show(const ShowArguments& arguments) {
  return ReadHost(arguments.host, [&](StandIn::Kernel& kernel) {
    if (arguments.domain) RequireDomain(kernel.Module(), *arguments.domain);
    if (arguments.isJson) {
      PrintJson(HeldJson(kernel, arguments.domain));
    } else {
      SecPolicy::DisplayPolicy(arguments.domain ? std::to_string(*arguments.domain) : "");
    }
    return kDone;
  });
}

}  // namespace

CommandLine ShowVerb() {
  const auto arguments = std::make_shared<ShowArguments>();
  return {.name = "show",
          .description = "Print the policy that a host's kernel holds",
          .options = {HostOption(arguments->host), JsonOption(arguments->isJson)},
          .operands = {{.names = {"DOMAIN-ID"},
                        .description = "The one domain to show; without it, all",
                        .store =
                            [arguments](const std::string& text) {
                              arguments->domain = static_cast<unsigned int>(
                                  WholeNumber(text, 0, std::numeric_limits<unsigned int>::max()));
                            }}},
          .run = [arguments] { return Show(*arguments); }};
}

}  // namespace SecPolicyTool
