// Domains as such.
#include <algorithm>
#include <array>

#include "host/module/module_error.h"
#include "host/module/nearest_word.h"
#include "tools/check/domain_lines.h"

namespace SecPolicyTool {

namespace {

struct RequiredDomain {
  const char* name;
  const char* loadMessage;
};

constexpr std::array<RequiredDomain, 3> kRequired{{
    {"globalVMDom", "Failed to fetch domainID for global VM Domain"},
    {"ioFilterDom", "Failed to fetch domainID for IOFilter domain"},
    {"appDom", "Failed to fetch domainID for default tar disk domain"},
}};

void CheckName(const CheckedFile& file, CheckContext& context) {
  if (context.module.FindDomain(file.name)) return;
  try {
    context.module.CreateDomain(file.name, StandIn::DomainOrigin::kPolicy);
  } catch (const StandIn::ModuleError& refusal) {
    context.findings.AddError(Kind::kRefusedName, SpotOf(file), refusal.what(),
                              "Failed to create domain: " + file.name,
                              "until it is mended, no rule of any domain is read");
  }
}

void CheckRequired(const RequiredDomain& required, const CheckedDirectory& domains,
                   CheckContext& context) {
  if (context.module.FindDomain(required.name)) return;
  std::vector<std::string> names;
  for (const CheckedFile& file : domains.files) names.push_back(file.name);
  const std::string wanted = domains.shown + "/" + required.name;
  const auto nearest = StandIn::NearestWord(required.name, names);
  context.findings.AddError(
      Kind::kMissingDomain, SpotOf(domains.shown),
      std::string("the domain \"") + required.name + "\" is missing, so a load is terminated",
      required.loadMessage,
      nearest ? "is " + domains.shown + "/" + *nearest + " to be named " + required.name + "?"
              : "make a file " + wanted + "; it may be empty");
}

}  // namespace

void CheckDomainNames(const CheckedDirectory& domains, CheckContext& context) {
  for (const CheckedFile& file : domains.files) CheckName(file, context);
  for (const RequiredDomain& required : kRequired) CheckRequired(required, domains, context);
}

bool IsRequiredDomain(const std::string& name) {
  return std::any_of(kRequired.begin(), kRequired.end(),
                     [&](const RequiredDomain& required) { return required.name == name; });
}

}  // namespace SecPolicyTool
