// What a kernel holds, and what a check finds.
#include <nlohmann/json.hpp>
#include <optional>

#include "bindings/c/text.h"
#include "tools/check/check.h"
#include "tools/check/report_forms.h"
#include "tools/query/bad_request.h"
#include "tools/requests/held_json.h"

using nlohmann::json;
using SecPolicyC::AnswerWithText;
using SecPolicyC::PolicyDirOf;
using SecPolicyC::RequireSet;
using StandIn::HostDirectory;

namespace {

json ShowHeld(const std::string& hostPath, const std::optional<unsigned int>& domain) {
  StandIn::Kernel kernel(HostDirectory(hostPath),
                         {.state = StandIn::KernelOptions::State::kSnapshot});
  if (domain && !kernel.Module().GetDomainInfo(*domain)) {
    throw SecPolicyTool::BadRequest("no domain has the id " + std::to_string(*domain));
  }
  return SecPolicyTool::HeldJson(kernel, domain);
}

}  // namespace

extern "C" {

secpolicy_status secpolicy_show(const secpolicy_host* host, uint32_t domain,
                                secpolicy_text** result, secpolicy_error** error) {
  return AnswerWithText(result, error, [&] {
    RequireSet(host, "host");
    const auto chosen =
        domain == SECPOLICY_ALL_DOMAINS ? std::nullopt : std::optional<unsigned int>(domain);
    return [host, chosen] { return ShowHeld(host->path, chosen); };
  });
}

secpolicy_status secpolicy_check(const secpolicy_host* host, const char* directory,
                                 secpolicy_text** result, secpolicy_error** error) {
  return AnswerWithText(result, error, [&] {
    RequireSet(host, "host");
    const std::string dir = PolicyDirOf(directory, "directory");
    return [host, dir] {
      return SecPolicyTool::JsonForm(
          SecPolicyTool::CheckWholePolicy(HostDirectory(host->path), dir), dir);
    };
  });
}

}  // extern "C"
