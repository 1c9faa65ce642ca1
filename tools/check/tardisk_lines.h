// The policy files of tardisks.
#pragma once

#include "tools/check/check_context.h"
#include "tools/policy/policy_files.h"

namespace SecPolicyTool {

// Whether a load reads these files.
enum class TardiskFiles {
  kLoaded,      // they are those of kTardiskPolicyDir
  kToBePacked,  // they lie in the policy directory, and are to come into tardisks
};

// Adds what is wrong with each line, and, with files that a load reads, which tardisk they are of;
// and notes what they refer to.
void CheckTardiskFiles(const CheckedDirectory& tardisks, TardiskFiles files, CheckContext& context);

}  // namespace SecPolicyTool
