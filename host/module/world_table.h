// Which domain a world runs in.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>

#include "host/module/domain_table.h"
#include "host/module/rule.h"

namespace StandIn {

// Worlds that were placed run where they were placed; else the world that asks, `self`, runs in the
// root domain; else the worlds that the description names run in the domain of that name, while it
// exists. No other world is known.
class WorldTable {
 public:
  explicit WorldTable(const std::map<WorldId, std::string>& described);

  // The domain must exist, and may not be destroyed while a world is in it.
  void Place(WorldId world, DomainId domain);
  [[nodiscard]] const std::map<WorldId, DomainId>& Placed() const { return placed_; }

  // Nothing for an unknown world.
  [[nodiscard]] std::optional<DomainId> DomainOf(WorldId world, WorldId self,
                                                 const DomainTable& domains) const;
  // The number of worlds in a domain.
  [[nodiscard]] std::uint32_t CountIn(DomainId domain, const std::string& name, WorldId self) const;

 private:
  std::map<WorldId, std::string> described_;  // without those that were placed
  std::map<std::string, std::uint32_t> describedByName_;
  std::map<WorldId, DomainId> placed_;
  std::map<DomainId, std::uint32_t> placedByDomain_;
};

}  // namespace StandIn
