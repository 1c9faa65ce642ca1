#include "host/module/world_table.h"

#include <utility>

namespace StandIn {

WorldTable::WorldTable(const std::map<WorldId, std::string>& described) : described_(described) {
  for (const auto& [world, name] : described_) {
    ++describedByName_[name];
  }
}

void WorldTable::Place(WorldId world, DomainId domain) {
  // Found or made first: once the world is placed, nothing may fail.
  std::uint32_t& inDomain = placedByDomain_[domain];
  const auto [place, isNew] = placed_.try_emplace(world, domain);
  if (!isNew) --placedByDomain_[std::exchange(place->second, domain)];
  ++inDomain;
  if (const auto described = described_.find(world); described != described_.end()) {
    --describedByName_[described->second];
    described_.erase(described);
  }
}

std::optional<DomainId> WorldTable::DomainOf(WorldId world, WorldId self,
                                             const DomainTable& domains) const {
  if (const auto placed = placed_.find(world); placed != placed_.end()) {
    return placed->second;
  }
  if (world == self) {
    return kRootDomain;
  }
  const auto described = described_.find(world);
  return described == described_.end() ? std::nullopt : domains.Find(described->second);
}

std::uint32_t WorldTable::CountIn(DomainId domain, const std::string& name, WorldId self) const {
  std::uint32_t count = 0;
  if (const auto placed = placedByDomain_.find(domain); placed != placedByDomain_.end()) {
    count += placed->second;
  }
  if (const auto described = describedByName_.find(name); described != describedByName_.end()) {
    count += described->second;
  }
  if (placed_.contains(self)) {
    return count;
  }
  if (const auto described = described_.find(self);
      described != described_.end() && described->second == name) {
    --count;  // the world that asks runs in the root domain, whatever the description says
  }
  return domain == kRootDomain ? count + 1 : count;
}

}  // namespace StandIn
