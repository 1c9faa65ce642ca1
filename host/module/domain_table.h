// The domains and their slots.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <unordered_map>
#include <vector>

#include "host/module/process_table.h"
#include "host/module/rule.h"
#include "platform/private_calls.h"

namespace StandIn {

// The predefined domain in slot 0, in which the host's own programs run.
inline constexpr DomainId kRootDomain = 0;
inline constexpr char kRootDomainName[] = "rootDom";

struct Domain {
  std::string name;
  ZekCtl::Kernel::DomainOrigin origin = ZekCtl::Kernel::DomainOrigin::kPolicy;
  ProcessIdentity maker;              // of domains made at run time
  std::vector<std::string> services;  // in the order in which they were added
};

// What throws changes nothing.
class DomainTable {
 public:
  // `slots` (at least 1) slots, of which the first holds the root domain.
  explicit DomainTable(std::uint32_t slots);

  [[nodiscard]] std::uint32_t Slots() const { return slots_; }
  [[nodiscard]] const std::map<DomainId, Domain>& All() const { return domains_; }
  [[nodiscard]] std::optional<DomainId> Find(const std::string& name) const;
  // nullptr when the slot is free.
  [[nodiscard]] const Domain* Get(DomainId id) const;
  // ModuleError ENOENT `no domain has the id ID` when the slot is free.
  [[nodiscard]] const Domain& At(DomainId id) const;
  void Require(DomainId id) const;

  // Takes the lowest free slot. ModuleError as SecurityModule::CreateDomain.
  DomainId Create(Domain domain);
  // Takes this slot, which must exist and be free; the name must be a good one and unused.
  void CreateAt(DomainId id, Domain domain);
  // ModuleError ENOENT; EBUSY for the root domain.
  void Destroy(DomainId id);
  // A service that is there already is not added. ModuleError ENOENT.
  void AddService(DomainId id, const std::string& service);

 private:
  std::uint32_t slots_;
  std::map<DomainId, Domain> domains_;
  std::unordered_map<std::string, DomainId> ids_;
  std::set<DomainId> freed_;  // free slots below unused_
  DomainId unused_ = 0;       // from here on no slot was ever taken
};

}  // namespace StandIn
