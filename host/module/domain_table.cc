#include "host/module/domain_table.h"

#include <algorithm>
#include <cerrno>
#include <tuple>

#include "host/module/module_error.h"
#include "host/module/names.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

DomainTable::DomainTable(std::uint32_t slots) : slots_(slots) {
  Domain root;
  root.name = kRootDomainName;
  CreateAt(kRootDomain, std::move(root));
}

std::optional<DomainId> DomainTable::Find(const std::string& name) const {
  const auto found = ids_.find(name);
  return found == ids_.end() ? std::nullopt : std::optional<DomainId>(found->second);
}

const Domain* DomainTable::Get(DomainId id) const {
  const auto found = domains_.find(id);
  return found == domains_.end() ? nullptr : &found->second;
}

const Domain& DomainTable::At(DomainId id) const {
  const Domain* const domain = Get(id);
  if (domain == nullptr) {
    throw ModuleError(ENOENT, StrCat("no domain has the id ", id));
  }
  return *domain;
}

void DomainTable::Require(DomainId id) const { std::ignore = At(id); }

DomainId DomainTable::Create(Domain domain) {
  RequireName("domain name", domain.name);
  if (ids_.contains(domain.name)) {
    throw ModuleError(EEXIST, StrCat("a domain named \"", domain.name, "\" exists already"));
  }
  const DomainId id = freed_.empty() ? unused_ : *freed_.begin();
  if (id >= slots_) {
    throw ModuleError(ENOSPC, StrCat("no slot is free for the domain \"", domain.name, "\": all ",
                                     slots_, " are taken"));
  }
  CreateAt(id, std::move(domain));
  return id;
}

void DomainTable::CreateAt(DomainId id, Domain domain) {
  for (; unused_ <= id; ++unused_) {
    freed_.insert(freed_.end(), unused_);
  }
  const auto name = ids_.emplace(domain.name, id).first;
  try {
    domains_.emplace(id, std::move(domain));
  } catch (...) {
    ids_.erase(name);
    throw;
  }
  freed_.erase(id);
}

void DomainTable::Destroy(DomainId id) {
  const Domain& domain = At(id);
  if (id == kRootDomain) {
    throw ModuleError(EBUSY, StrCat("the domain \"", domain.name, "\" is predefined and stays"));
  }
  freed_.insert(id);
  ids_.erase(domain.name);
  domains_.erase(id);
}

void DomainTable::AddService(DomainId id, const std::string& service) {
  const std::vector<std::string>& known = At(id).services;
  if (std::find(known.begin(), known.end(), service) == known.end()) {
    domains_.find(id)->second.services.push_back(service);
  }
}

}  // namespace StandIn
