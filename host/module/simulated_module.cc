#include "host/module/simulated_module.h"

#include <cerrno>

#include "host/module/module_error.h"
#include "host/module/names.h"
#include "host/module/state_json.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

std::unordered_map<std::string, long> Numbered(const std::vector<std::string>& words) {
  std::unordered_map<std::string, long> numbered;
  for (std::size_t i = 0; i < words.size(); ++i) {
    numbered.emplace(words[i], static_cast<long>(i + 1));
  }
  return numbered;
}

}  // namespace

SimulatedModule::SimulatedModule(ModuleDescription description, const ProcessTable& processes)
    : description_(std::move(description)),
      processes_(processes),
      state_(std::make_unique<ModuleState>(description_)) {
  for (const auto& [list, words] : description_.words) {
    words_.at(static_cast<std::size_t>(list)) = Numbered(words);
  }
}

std::unique_ptr<StorableModule> StartModule(ModuleDescription description,
                                            const ProcessTable& processes) {
  return std::make_unique<SimulatedModule>(std::move(description), processes);
}

void SimulatedModule::Save(const TextSink& sink) const { WriteState(*state_, sink); }

std::string SimulatedModule::Save() const {
  std::string text;
  Save([&text](std::string_view part) { text += part; });
  return text;
}

void SimulatedModule::Restore(const TextReader& text, const std::string& file) {
  state_ = ReadState(text, file, description_);
}

void SimulatedModule::Restore(const std::string& text, const std::string& file) {
  Restore(ReaderOf(text), file);
}

WorldId SimulatedModule::Self() const { return processes_.Self().pid; }

// ---- Domains ----

std::uint32_t SimulatedModule::WorldsIn(DomainId domain) const {
  return state_->worlds.CountIn(domain, state_->domains.At(domain).name, Self());
}

std::optional<DomainId> SimulatedModule::FindDomain(const std::string& name) {
  return state_->domains.Find(name);
}

DomainId SimulatedModule::CreateDomain(const std::string& name, DomainOrigin origin) {
  Domain domain{name, origin, {}, {}};
  if (origin == DomainOrigin::kRunTime) {
    domain.maker = processes_.Self();
  }
  return state_->domains.Create(std::move(domain));
}

void SimulatedModule::DestroyDomain(DomainId domain) {
  const std::string name = DomainName(domain);
  if (const std::uint32_t worlds = WorldsIn(domain); domain != kRootDomain && worlds != 0) {
    throw ModuleError(EBUSY, StrCat("the domain \"", name, "\" has ", worlds,
                                    worlds == 1 ? " world" : " worlds", " running in it"));
  }
  state_->domains.Destroy(domain);
  state_->rules.ForgetDomain(domain);
  state_->fileRules.erase(domain);
  std::erase_if(state_->roles, [domain](const auto& role) { return role.second == domain; });
}

std::string SimulatedModule::DomainName(DomainId domain) { return state_->domains.At(domain).name; }

std::optional<DomainInfo> SimulatedModule::GetDomainInfo(DomainId domain) {
  const Domain* const found = state_->domains.Get(domain);
  if (found == nullptr) {
    return std::nullopt;
  }
  const std::uint32_t worlds = WorldsIn(domain);
  return DomainInfo{found->name, description_.enforcementLevel, 1,
                    worlds + state_->rules.TransitionsInto(domain), worlds};
}

std::uint32_t SimulatedModule::MaxDomains() { return state_->domains.Slots(); }

std::vector<DomainId> SimulatedModule::LeakedDomains() {
  std::vector<DomainId> leaked;
  for (const auto& [id, domain] : state_->domains.All()) {
    if (domain.origin == DomainOrigin::kRunTime && WorldsIn(id) == 0 &&
        !processes_.Runs(domain.maker)) {
      leaked.push_back(id);
    }
  }
  return leaked;
}

void SimulatedModule::SetDomainRole(DomainRole role, DomainId domain) {
  state_->domains.Require(domain);
  state_->roles[role] = domain;
}

void SimulatedModule::AddService(DomainId domain, const std::string& service) {
  RequireFreeWord("service", service);
  state_->domains.AddService(domain, service);
}

// ---- Worlds ----

DomainId SimulatedModule::WorldDomain(WorldId world) {
  const auto domain = state_->worlds.DomainOf(world, Self(), state_->domains);
  if (!domain) {
    throw ModuleError(ESRCH, StrCat("no world has the id ", world));
  }
  return *domain;
}

void SimulatedModule::PlaceWorld(WorldId world, DomainId domain) {
  state_->domains.Require(domain);
  if (world <= 0) {
    throw ModuleError(EINVAL, StrCat("the world id ", world, " is not positive"));
  }
  state_->worlds.Place(world, domain);
}

// ---- Tardisks ----

std::string SimulatedModule::Tardisk(TardiskWord word) {
  const TardiskWords& words = description_.tardisk;
  switch (word) {
    case TardiskWord::kLaunchDomain:
      return words.launchDomain;
    case TardiskWord::kExecEvent:
      return words.execEvent;
    case TardiskWord::kDefaultLabel:
      return words.defaultLabel;
    case TardiskWord::kDefaultDomain:
      return words.defaultDomain;
  }
  throw ModuleError(EINVAL,
                    StrCat("no word about tardisks has the number ", static_cast<unsigned>(word)));
}

}  // namespace StandIn
