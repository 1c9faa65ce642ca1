// What is odd about a file, whatever its lines mean.
#pragma once

#include "tools/check/findings.h"

namespace SecPolicyTool {

// Adds lines that are too long, NUL bytes, and tabs and carriage returns in words.
void CheckOddities(const CheckedFile& file, Findings& findings);

}  // namespace SecPolicyTool
