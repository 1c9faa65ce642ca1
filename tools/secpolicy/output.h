// What the command tells its user.
#pragma once

#include <string>

namespace SecPolicyTool {

// "Error: " + text on standard error: the form in which the library reports, too.
void ReportError(const std::string& text);

// Flushes standard output; throws std::runtime_error when something of it could not be written, so
// that a full disk does not pass for success.
void FlushOutput();

}  // namespace SecPolicyTool
