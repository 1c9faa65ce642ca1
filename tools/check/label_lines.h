// The lines of file label files.
#pragma once

#include "tools/check/check_context.h"

namespace SecPolicyTool {

// Adds what is wrong with each line, what the load could not label, and what a later line
// overrides; and notes what the lines refer to. Lines that the load did not come to are applied in
// the module.
void CheckLabelFiles(const CheckedDirectory& labels, CheckContext& context);

}  // namespace SecPolicyTool
