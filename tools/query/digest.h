// One word for what a policy means.
#pragma once

#include <string>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

// The SHA-256 of the policy's meaning, as 64 hexadecimal digits: its domains with their decisions,
// its objects, and what its host's files and tardisks are labelled with. Neither the order in which
// these were set nor places, ids or predefined objects count.
//
// The hashed text is, in byte order, a record for each of these: a line of netstrings
// ("LENGTH:BYTES,") that begins with its kind, in the version that the first record names. It is
// kept as it is: digests of different versions of the command have to be comparable.
std::string Digest(const Policy& policy);

}  // namespace SecPolicyTool
