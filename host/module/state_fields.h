// The words, numbers and rows of a saved state.
#pragma once

#include <array>
#include <cstdint>
#include <limits>
#include <vector>

#include "host/json/json_cursor.h"
#include "host/module/domain_table.h"
#include "host/module/rule.h"
#include "host/module/security_module.h"

namespace StandIn {

inline constexpr std::uint64_t kStateFormat = 1;

inline constexpr char kOfPolicy[] = "policy";
inline constexpr char kOfRunTime[] = "runTime";

struct RoleKey {
  DomainRole role;
  const char* key;
};
inline constexpr std::array<RoleKey, 2> kRoleKeys{
    {{DomainRole::kGlobalVM, "globalVM"}, {DomainRole::kIoFilter, "ioFilter"}}};

inline constexpr std::uint64_t kMost32 = std::numeric_limits<std::uint32_t>::max();
inline constexpr std::uint64_t kMostWorld = std::numeric_limits<WorldId>::max();

// As JsonCursor::Unsigned; `most` must be within the result's range.
std::uint32_t Read32(const JsonCursor& place, std::uint64_t least, std::uint64_t most);
WorldId ReadWorld(const JsonCursor& place, std::uint64_t least);

// The id of a domain that exists; HostError `no domain has the id ID`.
DomainId ReadDomainId(const JsonCursor& place, const DomainTable& domains);

// The elements of the member `key`; none when there is no such member.
std::vector<JsonCursor> ItemsOf(const JsonCursor& object, const char* key);
// The elements of an array that must have `size` of them.
std::vector<JsonCursor> RowOf(const JsonCursor& place, std::size_t size);

}  // namespace StandIn
