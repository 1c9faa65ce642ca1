// The file rule operations of the simulated module.
#include <cerrno>

#include "host/module/module_error.h"
#include "host/module/names.h"
#include "host/module/simulated_module.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

void RequirePermission(std::uint32_t permission) {
  std::uint32_t unknown = permission;
  for (const PermissionBit& known : kPermissionBits) {
    unknown &= ~known.bit;
  }
  if (unknown != 0) {
    throw ModuleError(EINVAL, StrCat("the permission ", permission, " has unknown bits"));
  }
}

[[noreturn]] void ThrowNoRule(const std::string& owner, const std::string& path) {
  throw ModuleError(ENOENT, StrCat(owner, " has no file rule for \"", path, "\""));
}

}  // namespace

void SimulatedModule::CheckFileRule(DomainId domain, const FileRule& rule) const {
  RequirePath("path", rule.path);
  RequirePermission(rule.permission);
  if (rule.world == 0) {
    return;
  }
  const auto home = state_->worlds.DomainOf(rule.world, Self(), state_->domains);
  if (!home) {
    throw ModuleError(ESRCH, StrCat("no world has the id ", rule.world));
  }
  if (*home != domain) {
    throw ModuleError(EINVAL, StrCat("the world ", rule.world, " runs in the domain \"",
                                     state_->domains.At(*home).name, "\", not in \"",
                                     state_->domains.At(domain).name, "\""));
  }
}

void SimulatedModule::AddFileRules(DomainId domain, const std::vector<FileRule>& rules,
                                   std::uint32_t& taken) {
  taken = 0;
  const std::string& name = state_->domains.At(domain).name;
  FileRuleTable& table = state_->fileRules[domain];
  const std::uint32_t limit = description_.limits.fileRulesPerDomain;
  for (const FileRule& rule : rules) {
    CheckFileRule(domain, rule);
    if (table.Size() >= limit && !table.Holds(rule.world, rule.path)) {
      throw ModuleError(ENOSPC, StrCat("no room is left for the file rule \"", rule.path,
                                       "\" of the domain \"", name, "\": it has ", limit));
    }
    table.Set(rule);
    ++taken;
  }
}

void SimulatedModule::RemoveFileRule(WorldId world, DomainId domain, const std::string& path) {
  const std::string owner = StrCat("the domain \"", state_->domains.At(domain).name, "\"");
  if (!state_->fileRules[domain].Remove(world, path)) {
    ThrowNoRule(world == 0 ? owner : StrCat("the world ", world, " of ", owner), path);
  }
}

void SimulatedModule::UpdateFileRule(DomainId domain, const std::string& path,
                                     std::uint32_t permission) {
  const std::string owner = StrCat("the domain \"", state_->domains.At(domain).name, "\"");
  RequirePermission(permission);
  if (!state_->fileRules[domain].Update(path, permission)) {
    ThrowNoRule(owner, path);
  }
}

void SimulatedModule::ReplacePath(const std::string& oldPath, const std::string& newPath) {
  RequirePath("new path", newPath);
  bool renamed = false;
  for (auto& [domain, table] : state_->fileRules) {
    renamed = table.Rename(oldPath, newPath) || renamed;
  }
  if (!renamed) {
    throw ModuleError(ENOENT, StrCat("no file rule names the path \"", oldPath, "\""));
  }
}

std::uint32_t SimulatedModule::CountFileRules(DomainId domain) {
  state_->domains.Require(domain);
  const auto table = state_->fileRules.find(domain);
  return table == state_->fileRules.end() ? 0 : static_cast<std::uint32_t>(table->second.Size());
}

std::vector<FileRule> SimulatedModule::FileRules(DomainId domain) {
  state_->domains.Require(domain);
  const auto table = state_->fileRules.find(domain);
  if (table == state_->fileRules.end()) {
    return {};
  }
  return {table->second.Rules().begin(), table->second.Rules().end()};
}

}  // namespace StandIn
