// The lines of object files.
#pragma once

#include <map>

#include "tools/check/check_context.h"

namespace SecPolicyTool {

// Where objects are defined first.
using DefinedObjects = std::map<std::string, Spot>;

// Adds what is wrong with each line. Asks the module to define what it does not hold, so that it is
// no longer as the load left it.
DefinedObjects CheckObjectFiles(const CheckedDirectory& objects, CheckContext& context);

}  // namespace SecPolicyTool
