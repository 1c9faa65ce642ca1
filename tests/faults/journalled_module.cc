#include "tests/faults/journalled_module.h"

namespace StandIn {

void JournalledModule::Replay(SecurityModule& module) const {
  for (const Change& change : changes_) change(module);
}

// ---- What only reads ----------------------------------------------------------------------------

std::optional<DomainId> JournalledModule::FindDomain(const std::string& name) {
  return module_.FindDomain(name);
}

std::string JournalledModule::DomainName(DomainId domain) { return module_.DomainName(domain); }

std::optional<DomainInfo> JournalledModule::GetDomainInfo(DomainId domain) {
  return module_.GetDomainInfo(domain);
}

std::uint32_t JournalledModule::MaxDomains() { return module_.MaxDomains(); }

std::vector<DomainId> JournalledModule::LeakedDomains() { return module_.LeakedDomains(); }

DomainId JournalledModule::WorldDomain(WorldId world) { return module_.WorldDomain(world); }

void JournalledModule::ValidateWord(WordList list, const std::string& word) {
  return module_.ValidateWord(list, word);
}

std::map<std::string, long> JournalledModule::Words(WordList list) { return module_.Words(list); }

std::vector<Rule> JournalledModule::Rules(RuleType type, DomainId domain) {
  return module_.Rules(type, domain);
}

void JournalledModule::CheckCapabilityParams(const std::string& domainName,
                                             const std::vector<Rule>& rules) {
  return module_.CheckCapabilityParams(domainName, rules);
}

std::vector<std::string> JournalledModule::InvalidLabels(LabelType type) {
  return module_.InvalidLabels(type);
}

bool JournalledModule::IsPredefinedLabel(const std::string& label, LabelType type) {
  return module_.IsPredefinedLabel(label, type);
}

bool JournalledModule::IsPrivilegedVm(const std::string& name) {
  return module_.IsPrivilegedVm(name);
}

LabelId JournalledModule::LookupLabel(const std::string& label, LabelType type) {
  return module_.LookupLabel(label, type);
}

std::string JournalledModule::LabelName(LabelId label, LabelType type) {
  return module_.LabelName(label, type);
}

std::uint32_t JournalledModule::CountFileRules(DomainId domain) {
  return module_.CountFileRules(domain);
}

std::vector<FileRule> JournalledModule::FileRules(DomainId domain) {
  return module_.FileRules(domain);
}

LabelId JournalledModule::FileLabel(const std::string& path) { return module_.FileLabel(path); }

std::string JournalledModule::Tardisk(TardiskWord word) { return module_.Tardisk(word); }

// ---- What changes the module --------------------------------------------------------------------

DomainId JournalledModule::CreateDomain(const std::string& name, DomainOrigin origin) {
  const DomainId result = module_.CreateDomain(name, origin);
  Remember([&] {
    return [name, origin](SecurityModule& module) { module.CreateDomain(name, origin); };
  });
  return result;
}

void JournalledModule::DestroyDomain(DomainId domain) {
  module_.DestroyDomain(domain);
  Remember([&] { return [domain](SecurityModule& module) { module.DestroyDomain(domain); }; });
}

void JournalledModule::SetDomainRole(DomainRole role, DomainId domain) {
  module_.SetDomainRole(role, domain);
  Remember([&] {
    return [role, domain](SecurityModule& module) { module.SetDomainRole(role, domain); };
  });
}

void JournalledModule::AddService(DomainId domain, const std::string& service) {
  module_.AddService(domain, service);
  Remember([&] {
    return [domain, service](SecurityModule& module) { module.AddService(domain, service); };
  });
}

void JournalledModule::PlaceWorld(WorldId world, DomainId domain) {
  module_.PlaceWorld(world, domain);
  Remember([&] {
    return [world, domain](SecurityModule& module) { module.PlaceWorld(world, domain); };
  });
}

void JournalledModule::SetRule(RuleType type, DomainId domain, const Rule& rule) {
  module_.SetRule(type, domain, rule);
  Remember([&] {
    return [type, domain, rule](SecurityModule& module) { module.SetRule(type, domain, rule); };
  });
}

void JournalledModule::AddLabels(const std::vector<std::string>& labels, LabelType type) {
  module_.AddLabels(labels, type);
  Remember(
      [&] { return [labels, type](SecurityModule& module) { module.AddLabels(labels, type); }; });
}

void JournalledModule::RemoveLabels(const std::vector<std::string>& labels, LabelType type) {
  module_.RemoveLabels(labels, type);
  Remember([&] {
    return [labels, type](SecurityModule& module) { module.RemoveLabels(labels, type); };
  });
}

void JournalledModule::AddFileRules(DomainId domain, const std::vector<FileRule>& rules,
                                    std::uint32_t& taken) {
  module_.AddFileRules(domain, rules, taken);
  Remember([&] {
    return [domain, rules](SecurityModule& module) {
      std::uint32_t ignored = 0;
      module.AddFileRules(domain, rules, ignored);
    };
  });
}

void JournalledModule::RemoveFileRule(WorldId world, DomainId domain, const std::string& path) {
  module_.RemoveFileRule(world, domain, path);
  Remember([&] {
    return [world, domain, path](SecurityModule& module) {
      module.RemoveFileRule(world, domain, path);
    };
  });
}

void JournalledModule::UpdateFileRule(DomainId domain, const std::string& path,
                                      std::uint32_t permission) {
  module_.UpdateFileRule(domain, path, permission);
  Remember([&] {
    return [domain, path, permission](SecurityModule& module) {
      module.UpdateFileRule(domain, path, permission);
    };
  });
}

void JournalledModule::ReplacePath(const std::string& oldPath, const std::string& newPath) {
  module_.ReplacePath(oldPath, newPath);
  Remember([&] {
    return [oldPath, newPath](SecurityModule& module) { module.ReplacePath(oldPath, newPath); };
  });
}

void JournalledModule::SetFileLabel(const std::string& path, LabelId label) {
  module_.SetFileLabel(path, label);
  Remember(
      [&] { return [path, label](SecurityModule& module) { module.SetFileLabel(path, label); }; });
}

}  // namespace StandIn
