#include "tools/policy/held_policy.h"

#include <cerrno>

#include "host/module/module_error.h"

namespace SecPolicyTool {

using namespace StandIn;

namespace {

PolicyRule ToPolicyRule(RuleType type, Rule&& rule) {
  PolicyRule held;
  held.key = {type, std::move(rule.words), 0};
  held.isGranted = rule.decision == Decision::kGrant;
  if (rule.line != 0) held.place = Place{{}, rule.line, 0};
  return held;
}

PolicyRule ToPolicyRule(const FileRule& rule) {
  PolicyRule held;
  held.key = {RuleType::kPath, {rule.path}, rule.world};
  held.permission = rule.permission;
  return held;
}

std::vector<PolicyRule> RulesOf(SecurityModule& module, DomainId domain) {
  std::vector<PolicyRule> rules;
  for (const RuleTypeInfo& info : kRuleTypes) {
    if (info.HasDecision()) {
      std::vector<Rule> set = module.Rules(info.type, domain);
      rules.reserve(rules.size() + set.size());
      for (Rule& rule : set) rules.push_back(ToPolicyRule(info.type, std::move(rule)));
    } else {
      for (const FileRule& rule : module.FileRules(domain)) rules.push_back(ToPolicyRule(rule));
    }
  }
  return rules;
}

// A label that was removed has an id, but no name.
std::string LabelOf(SecurityModule& module, const std::string& path) {
  try {
    return module.LabelName(module.FileLabel(path), LabelType::kObject);
  } catch (const ModuleError& refusal) {
    if (refusal.Number() != ENOENT) throw;
    return {};
  }
}

void AddLabel(SecurityModule& module, const std::string& path, const std::string& name,
              std::map<std::string, LabelledFile>& files) {
  const std::string label = LabelOf(module, path);
  if (label != kUnlabelled) files[name] = {label, std::nullopt};
}

void AddLabels(SecurityModule& module, const ImageIndex& image, Policy& policy) {
  for (const char* path : {"/", kArchivesPath}) AddLabel(module, path, path, policy.files);
  for (const TardiskContent& tardisk : image.tardisks) {
    AddLabel(module, std::string(kArchivesPath) + "/" + tardisk.name, tardisk.name,
             policy.tardisks);
    for (const std::string& path : tardisk.paths) AddLabel(module, path, path, policy.files);
  }
}

}  // namespace

Policy HeldPolicy(SecurityModule& module, const ImageIndex& image) {
  Policy policy;
  for (DomainId domain = 0; domain < module.MaxDomains(); ++domain) {
    if (const auto info = module.GetDomainInfo(domain)) {
      policy.domains[info->name].rules = RulesOf(module, domain);
    }
  }
  for (const auto& [name, id] : module.Words(WordList::kObjects)) {
    policy.objects[name].isPredefined = module.IsPredefinedLabel(name, LabelType::kObject);
  }
  AddLabels(module, image, policy);
  policy.words = {
      module.Tardisk(TardiskWord::kLaunchDomain), module.Tardisk(TardiskWord::kExecEvent),
      module.Tardisk(TardiskWord::kDefaultLabel), module.Tardisk(TardiskWord::kDefaultDomain)};
  return policy;
}

Policy HeldPolicy(Kernel& kernel) {
  return HeldPolicy(kernel.Unobserved(), kernel.Files().Image());
}

Policy HeldPolicy(HostDirectory host) {
  Kernel kernel(std::move(host),
                {.state = KernelOptions::State::kSnapshot, .root = KernelOptions::Root::kOptional});
  return HeldPolicy(kernel);
}

}  // namespace SecPolicyTool
