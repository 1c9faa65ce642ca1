// What a name of a domain or a label, and a path of a file rule, may be.
#pragma once

#include <optional>
#include <string>

#include "platform/private_calls.h"

namespace StandIn {

inline constexpr std::size_t kLongestName = ZekCtl::Kernel::kDomainNameBytes - 1;
inline constexpr std::size_t kLongestPath = ZekCtl::Kernel::kPathBytes - 1;

// What is wrong with a name or a path: the errno, and a text that follows the name in a sentence.
struct NameFault {
  int number;
  std::string text;
};

// A name has 1 to kLongestName bytes and no NUL: EINVAL "is empty" or "holds a NUL byte",
// ENAMETOOLONG "is longer than 127 bytes". Nothing for a name that will do.
std::optional<NameFault> FaultOfName(const std::string& name);

// A path begins with a slash, has at most kLongestPath bytes and no NUL: EINVAL "is not absolute"
// or "holds a NUL byte", ENAMETOOLONG "is longer than 1983 bytes".
std::optional<NameFault> FaultOfPath(const std::string& path);

// Bytes that nothing else judges, such as a parameter: EINVAL "is empty" or "holds a NUL byte".
std::optional<NameFault> FaultOfFreeWord(const std::string& word);

// The name for a message, which ends at a NUL: NUL bytes are shown as \0.
std::string Shown(const std::string& name);

// Throw ModuleError `the WHAT "NAME" FAULT`; `what` is such as "domain name".
void RequireName(const char* what, const std::string& name);
void RequirePath(const char* what, const std::string& path);
void RequireFreeWord(const char* what, const std::string& word);

}  // namespace StandIn
