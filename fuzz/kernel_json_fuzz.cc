// The kept state of a module: it is refused with HostError and changes nothing, or it is taken over
// and saved as it was read the next time; what was taken over answers every question.
#include "fuzz/support/input.h"
#include "fuzz/support/require.h"
#include "fuzz/support/small_world.h"
#include "secpolicy/host/host_error.h"

namespace {

using StandIn::LabelType;
using StandIn::RuleType;

void RequireRulesOf(StandIn::SecurityModule& module, StandIn::DomainId domain) {
  for (const auto& info : ZekCtl::Security::kRuleTypes) {
    if (!info.HasDecision()) continue;
    for (const StandIn::Rule& rule : module.Rules(info.type, domain)) {
      Fuzz::Require(rule.words.size() == info.wordCount, "a rule has the words of its type");
      if (info.type == RuleType::kTransition) {
        Fuzz::Require(module.GetDomainInfo(rule.targetDomain).has_value(), "a target exists");
      }
    }
  }
  Fuzz::Require(module.FileRules(domain).size() == module.CountFileRules(domain),
                "file rules are counted");
  Fuzz::Require(module.CountFileRules(domain) <= Fuzz::SmallDescription().limits.fileRulesPerDomain,
                "file rules are within their limit");
}

void RequireWhole(StandIn::SecurityModule& module) {
  for (StandIn::DomainId id = 0; id < module.MaxDomains(); ++id) {
    const auto info = module.GetDomainInfo(id);
    if (!info) continue;
    Fuzz::Require(module.FindDomain(info->name) == id, "a domain is found by its name");
    RequireRulesOf(module, id);
  }
  for (const auto& [name, id] : module.Words(StandIn::WordList::kObjects)) {
    Fuzz::Require(module.LookupLabel(name, LabelType::kObject) == static_cast<unsigned long>(id),
                  "a label has one id");
  }
  Fuzz::Require(module.LeakedDomains().size() < module.MaxDomains(),
                "the first domain never leaks");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const SecPolicyTest::OneProcess processes;
  StandIn::SimulatedModule module(Fuzz::SmallDescription(), processes);
  const std::string before = module.Save();
  try {
    module.Restore(Fuzz::BytesOf(data, size), "kernel.json");
  } catch (const StandIn::HostError& error) {
    Fuzz::Require(std::string(error.what()).starts_with("kernel.json:"), "the file is named");
    Fuzz::RequireEqual(module.Save(), before, "a refused state changes nothing");
    return 0;
  }
  const std::string saved = module.Save();
  RequireWhole(module);
  module.Restore(saved, "kernel.json");
  Fuzz::RequireEqual(module.Save(), saved, "a state is saved as it was read");
  return 0;
}
