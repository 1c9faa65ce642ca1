#include "host/engine/accesses.h"

#include <algorithm>
#include <array>

namespace StandIn {

namespace {

constexpr std::uint32_t kRead = 0x1;
constexpr std::uint32_t kWrite = 0x2;
constexpr std::uint32_t kExecute = 0x10;

struct CoveredAccess {
  std::string_view access;
  std::uint32_t permission;
};
constexpr std::array<CoveredAccess, 9> kCoveredAccesses{{
    {"read", kRead},
    {"getattr", kRead},
    {"write", kWrite},
    {"append", kWrite},
    {kCreateAccess, kWrite},
    {"delete", kWrite},
    {"rename", kWrite},
    {"setattr", kWrite},
    {kExecAccess, kExecute},
}};

}  // namespace

std::optional<std::uint32_t> PermissionFor(std::string_view access) {
  const auto* const found =
      std::find_if(kCoveredAccesses.begin(), kCoveredAccesses.end(),
                   [&](const CoveredAccess& each) { return each.access == access; });
  if (found == kCoveredAccesses.end()) return std::nullopt;
  return found->permission;
}

}  // namespace StandIn
