// secpolicy host info DIR
#include <iostream>
#include <memory>

#include "host/kernel/kernel.h"
#include "host/module/description_json.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

using namespace StandIn;

namespace {

void PrintImage(Kernel& kernel) {
  if (!kernel.IsAssembled()) {
    std::cout << "Image: not assembled\n";
    return;
  }
  const ImageIndex& index = kernel.Files().Image();
  std::cout << "Image: " << index.tardisks.size() << " tardisks\n";
  for (const TardiskContent& tardisk : index.tardisks) {
    PrintLine(std::cout,
              "  " + tardisk.name + ": " + std::to_string(tardisk.paths.size()) + " paths");
  }
}

// The number of the domain's rules of each type that it has any of.
void PrintDomain(SecurityModule& module, DomainId domain) {
  const auto info = module.GetDomainInfo(domain);
  if (!info) return;
  std::string line = "  " + std::to_string(domain) + " " + info->name + ":";
  std::size_t rules = 0;
  const auto add = [&](const std::string& keyword, std::size_t count) {
    if (count != 0) line += " " + keyword + " " + std::to_string(count);
    rules += count;
  };
  for (const auto& type : ZekCtl::Security::kRuleTypes) {
    add(type.keyword, type.HasDecision() ? module.Rules(type.type, domain).size()
                                         : module.CountFileRules(domain));
  }
  PrintLine(std::cout, rules == 0 ? line + " no rules" : line);
}

void PrintKernel(SecurityModule& module) {
  std::cout << "Objects: " << module.Words(WordList::kObjects).size() << "\nDomains:\n";
  for (DomainId domain = 0; domain < module.MaxDomains(); ++domain) PrintDomain(module, domain);
}

void PrintInfo(const std::string& dir) {
  Kernel kernel(HostDirectory(dir),
                {.state = KernelOptions::State::kSnapshot, .root = KernelOptions::Root::kOptional});
  const HostDirectory& host = kernel.Directory();
  const ModuleLimits limits =
      ReadDescription(host.DescriptionText(), host.Ref().PathOf(kDescriptionFile)).limits;
  PrintLine(std::cout, "Host: " + host.Path());
  std::cout << "Limits: " << limits.domains << " domains, " << limits.labels
            << " labels of each type, " << limits.fileRulesPerDomain << " file rules a domain\n";
  PrintImage(kernel);
  PrintKernel(kernel.Unobserved());
}

}  // namespace

CommandLine HostInfoVerb() {
  const auto dir = std::make_shared<std::string>();
  return {.name = "info",
          .description = "Say what a host is made of and what its kernel holds",
          .operands = {HostOperand(*dir, "The host directory")},
          .run = [dir] {
            PrintInfo(*dir);
            return kDone;
          }};
}

}  // namespace SecPolicyTool
