// Which tardisk a file of the root file system came from.
#pragma once

#include <string>

namespace SecPolicy {

// The directory in which every mounted tardisk shows up as a file.
inline constexpr char kTardiskDir[] = "/tardisks/";

// The path of the tardisk that holds the policy file, or an empty string when none does. Throws as
// TardiskPolicy::GetBackingTardiskPath says.
[[nodiscard]] std::string BackingTardiskPath(const std::string& policyFile);

}  // namespace SecPolicy
