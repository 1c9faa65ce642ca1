// Finding the mounted tardisks and those that carry a policy of their own.
#pragma once

#include <list>
#include <string>

#include "tardisk/tardisk_policy.h"

namespace SecPolicy {

// Appends the paths of the mounted tardisks, in listing order. An entry that is no regular file is
// logged and skipped. Throws "Could not open tardisk dir /tardisks/".
void GetAllTardisks(std::list<std::string>& tardisks);

// Sorts the mounted tardisks: `withPolicy` gets an object, which becomes the caller's, for each
// policy file in `policyDir`, `withoutPolicy` the path of each tardisk that has none. A file that
// lies in no tardisk, or in one that has a file already, is logged and ignored. When `policyDir`
// does not exist, that is logged and both lists stay as they are. Throws what GetAllTardisks and
// TardiskPolicy::GetBackingTardiskPath throw, and "Unable to open policy directory for tardisks " +
// policyDir; `withPolicy` then holds the objects made until then, `withoutPolicy` what it held.
void GetTardiskLists(std::string policyDir, std::list<TardiskPolicy*>& withPolicy,
                     std::list<std::string>& withoutPolicy);

}  // namespace SecPolicy
