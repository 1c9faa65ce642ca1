#include "host/trace/observed_module.h"

#include "host/module/module_error.h"
#include "host/trace/operation_words.h"

namespace StandIn {

namespace {

std::string LabelWords(LabelType type, const std::vector<std::string>& labels) {
  return labels.empty() ? LabelTypeWord(type) : LabelTypeWord(type) + " " + Join(labels);
}

// The label's name, or "#" and its id when no label has it.
std::string LabelWord(SecurityModule& module, LabelId label) try {
  return module.LabelName(label, LabelType::kObject);
} catch (const ModuleError&) {
  return "#" + std::to_string(label);
}

std::string CapabilityParamWords(const std::vector<Rule>& rules) {
  std::string text;
  for (const Rule& rule : rules) text += "; " + RuleWords(RuleType::kCapabilityParam, rule);
  return text;
}

std::string FileRulesWords(const std::vector<FileRule>& rules) {
  std::string text;
  for (const FileRule& rule : rules) text += (text.empty() ? " " : "; ") + FileRuleWords(rule);
  return text;
}

std::string WorldWords(WorldId world) {
  return world == 0 ? std::string() : " # world " + std::to_string(world);
}

Operation TardiskOperation(TardiskWord word) {
  switch (word) {
    case TardiskWord::kLaunchDomain:
      return Operation::kTardiskLaunchDomain;
    case TardiskWord::kExecEvent:
      return Operation::kTardiskExecEvent;
    case TardiskWord::kDefaultLabel:
      return Operation::kDefaultTardiskLabel;
    case TardiskWord::kDefaultDomain:
      break;
  }
  return Operation::kDefaultTardiskDomain;
}

}  // namespace

std::optional<DomainId> ObservedModule::FindDomain(const std::string& name) {
  return point_.Pass(
      Operation::kFindDomain, [&] { return name; }, [&] { return module_.FindDomain(name); });
}

DomainId ObservedModule::CreateDomain(const std::string& name, DomainOrigin origin) {
  return point_.Pass(
      Operation::kCreateDomain,
      [&] { return name + (origin == DomainOrigin::kPolicy ? " policy" : " run-time"); },
      [&] { return module_.CreateDomain(name, origin); });
}

void ObservedModule::DestroyDomain(DomainId domain) {
  return point_.Pass(
      Operation::kDestroyDomain, [&] { return DomainWord(module_, domain); },
      [&] { return module_.DestroyDomain(domain); });
}

std::string ObservedModule::DomainName(DomainId domain) {
  return point_.Pass(
      Operation::kDomainName, [&] { return std::to_string(domain); },
      [&] { return module_.DomainName(domain); });
}

std::optional<DomainInfo> ObservedModule::GetDomainInfo(DomainId domain) {
  return point_.Pass(
      Operation::kDomainInfo, [&] { return std::to_string(domain); },
      [&] { return module_.GetDomainInfo(domain); });
}

std::uint32_t ObservedModule::MaxDomains() {
  return point_.Pass(Operation::kMaxDomains, kNoWords, [&] { return module_.MaxDomains(); });
}

std::vector<DomainId> ObservedModule::LeakedDomains() {
  return point_.Pass(Operation::kLeakedDomains, kNoWords, [&] { return module_.LeakedDomains(); });
}

void ObservedModule::SetDomainRole(DomainRole role, DomainId domain) {
  return point_.Pass(
      role == DomainRole::kGlobalVM ? Operation::kSetGlobalVMDomain : Operation::kSetIoFilterDomain,
      [&] { return DomainWord(module_, domain); },
      [&] { return module_.SetDomainRole(role, domain); });
}

void ObservedModule::AddService(DomainId domain, const std::string& service) {
  return point_.Pass(
      Operation::kAddService, [&] { return DomainWord(module_, domain) + " " + service; },
      [&] { return module_.AddService(domain, service); });
}

DomainId ObservedModule::WorldDomain(WorldId world) {
  return point_.Pass(
      Operation::kWorldDomain, [&] { return std::to_string(world); },
      [&] { return module_.WorldDomain(world); });
}

void ObservedModule::PlaceWorld(WorldId world, DomainId domain) {
  return point_.Pass(
      Operation::kPlaceWorld,
      [&] { return std::to_string(world) + " " + DomainWord(module_, domain); },
      [&] { return module_.PlaceWorld(world, domain); });
}

void ObservedModule::ValidateWord(WordList list, const std::string& word) {
  return point_.Pass(
      Operation::kValidateWord, [&] { return WordListWord(list) + " " + word; },
      [&] { return module_.ValidateWord(list, word); });
}

std::map<std::string, long> ObservedModule::Words(WordList list) {
  return point_.Pass(
      Operation::kWords, [&] { return WordListWord(list); }, [&] { return module_.Words(list); });
}

void ObservedModule::SetRule(RuleType type, DomainId domain, const Rule& rule) {
  return point_.Pass(
      Operation::kSetRule,
      [&] { return DomainWord(module_, domain) + " " + RuleWords(type, rule); },
      [&] { return module_.SetRule(type, domain, rule); });
}

std::vector<Rule> ObservedModule::Rules(RuleType type, DomainId domain) {
  return point_.Pass(
      Operation::kGetRules,
      [&] { return DomainWord(module_, domain) + " " + InfoOf(type).keyword; },
      [&] { return module_.Rules(type, domain); });
}

void ObservedModule::CheckCapabilityParams(const std::string& domainName,
                                           const std::vector<Rule>& rules) {
  return point_.Pass(
      Operation::kCheckCapabilityParams, [&] { return domainName + CapabilityParamWords(rules); },
      [&] { return module_.CheckCapabilityParams(domainName, rules); });
}

std::vector<std::string> ObservedModule::InvalidLabels(LabelType type) {
  return point_.Pass(
      Operation::kInvalidLabels, [&] { return LabelTypeWord(type); },
      [&] { return module_.InvalidLabels(type); });
}

void ObservedModule::AddLabels(const std::vector<std::string>& labels, LabelType type) {
  return point_.Pass(
      Operation::kAddLabels, [&] { return LabelWords(type, labels); },
      [&] { return module_.AddLabels(labels, type); });
}

void ObservedModule::RemoveLabels(const std::vector<std::string>& labels, LabelType type) {
  return point_.Pass(
      Operation::kRemoveLabels, [&] { return LabelWords(type, labels); },
      [&] { return module_.RemoveLabels(labels, type); });
}

bool ObservedModule::IsPredefinedLabel(const std::string& label, LabelType type) {
  return point_.Pass(
      Operation::kPredefinedLabel, [&] { return LabelWords(type, {label}); },
      [&] { return module_.IsPredefinedLabel(label, type); });
}

bool ObservedModule::IsPrivilegedVm(const std::string& name) {
  return point_.Pass(
      Operation::kPrivilegedVm, [&] { return name; }, [&] { return module_.IsPrivilegedVm(name); });
}

LabelId ObservedModule::LookupLabel(const std::string& label, LabelType type) {
  return point_.Pass(
      Operation::kLookupLabel, [&] { return LabelWords(type, {label}); },
      [&] { return module_.LookupLabel(label, type); });
}

std::string ObservedModule::LabelName(LabelId label, LabelType type) {
  return point_.Pass(
      Operation::kLabelName, [&] { return LabelTypeWord(type) + " " + std::to_string(label); },
      [&] { return module_.LabelName(label, type); });
}

void ObservedModule::AddFileRules(DomainId domain, const std::vector<FileRule>& rules,
                                  std::uint32_t& taken) {
  return point_.Pass(
      Operation::kAddFileRules, [&] { return DomainWord(module_, domain) + FileRulesWords(rules); },
      [&] { return module_.AddFileRules(domain, rules, taken); });
}

void ObservedModule::RemoveFileRule(WorldId world, DomainId domain, const std::string& path) {
  return point_.Pass(
      Operation::kRemoveFileRule,
      [&] { return DomainWord(module_, domain) + " " + path + WorldWords(world); },
      [&] { return module_.RemoveFileRule(world, domain, path); });
}

void ObservedModule::UpdateFileRule(DomainId domain, const std::string& path,
                                    std::uint32_t permission) {
  return point_.Pass(
      Operation::kUpdateFileRule,
      [&] {
        return DomainWord(module_, domain) + " " + FileRuleWords({0, path, permission});
      },
      [&] { return module_.UpdateFileRule(domain, path, permission); });
}

void ObservedModule::ReplacePath(const std::string& oldPath, const std::string& newPath) {
  return point_.Pass(
      Operation::kReplacePath, [&] { return oldPath + " " + newPath; },
      [&] { return module_.ReplacePath(oldPath, newPath); });
}

std::uint32_t ObservedModule::CountFileRules(DomainId domain) {
  return point_.Pass(
      Operation::kCountFileRules, [&] { return DomainWord(module_, domain); },
      [&] { return module_.CountFileRules(domain); });
}

std::vector<FileRule> ObservedModule::FileRules(DomainId domain) {
  return point_.Pass(
      Operation::kReadFileRules, [&] { return DomainWord(module_, domain); },
      [&] { return module_.FileRules(domain); });
}

void ObservedModule::SetFileLabel(const std::string& path, LabelId label) {
  return point_.Pass(
      Operation::kSetFileLabel, [&] { return path + " " + LabelWord(module_, label); },
      [&] { return module_.SetFileLabel(path, label); });
}

LabelId ObservedModule::FileLabel(const std::string& path) {
  return point_.Pass(
      Operation::kGetFileLabel, [&] { return path; }, [&] { return module_.FileLabel(path); });
}

std::string ObservedModule::Tardisk(TardiskWord word) {
  return point_.Pass(TardiskOperation(word), kNoWords, [&] { return module_.Tardisk(word); });
}

}  // namespace StandIn
