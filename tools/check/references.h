// What files refer to, and what nothing refers to.
#pragma once

#include "tools/check/check_context.h"
#include "tools/check/object_lines.h"

namespace SecPolicyTool {

// Adds objects that no line refers to, the predefined ones aside.
void CheckUnusedObjects(const DefinedObjects& objects, CheckContext& context);

// Adds domains without rules, and those that no program can come into: in which none starts, and
// into which no granted transition leads from one that a program can come into. Left out are the
// domains without which a load is terminated and files that look like backups.
void CheckDomainUse(const CheckedDirectory& domains, CheckContext& context);

}  // namespace SecPolicyTool
