// Numbers and names by which the kernel's security module is asked without the access library.
#pragma once

#include <cstddef>

namespace ZekCtl::Kernel {

// System calls above the ordinary ones. Each returns two values: a status (0 for success) and an
// error value (the negated errno, or 0 for none). The numbers from kFirst to kLast that have no
// name here are the module's own and answer "Function not implemented".
enum class PrivateCall : long {
  kCreateDomain = 16474,   // name, origin, address of the new id
  kDestroyDomain = 16475,  // domain id
  kUpdateRule = 16476,     // domain id, path, permission
  kRemoveRule = 16477,     // world id, domain id, path
  kReadRules = 16478,      // domain id, address of records, room in records
  kCountRules = 16479,     // domain id, address of the count
  kAddRules = 16480,       // world id, domain id, records, number of records, address of result
  kLeakedDomains = 16485,  // address of the count, address of ids, room in ids
  kWorldDomain = 16486,    // world id, address of the domain id
  kDomainName = 16487,     // domain id, address of the name's buffer, its length
  kReplacePath = 16488,    // old path, new path

  kFirst = kCreateDomain,  // the lowest number of the module's calls
  kLast = kReplacePath,    // the highest
};

// The second argument of kCreateDomain.
enum class DomainOrigin : unsigned int {
  kPolicy = 0,   // created by the load of a policy
  kRunTime = 1,  // created by a program; leaked when its maker ends and no world is in it
};

// Status of kReadRules when the caller's array is too small for the domain's table.
inline constexpr long kStatusTableTooSmall = 0x0bad011f;

// prctl(kPrctlResolvePath, path, buffer of kPathBytes): the path as the kernel sees it.
inline constexpr int kPrctlResolvePath = 4109;

// Extended attribute that holds a file's label: the label's id, 4 bytes in native byte order.
inline constexpr char kLabelAttribute[] = "olvane.security";

// Room for a file rule's path in bytes, the terminating NUL included.
inline constexpr std::size_t kPathBytes = 1984;
// Room for a domain's name in bytes, the terminating NUL included.
inline constexpr std::size_t kDomainNameBytes = 128;

}  // namespace ZekCtl::Kernel
