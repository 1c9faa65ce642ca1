// Messages on standard error, as the library and ReportError write them.
#pragma once

#include <string>
#include <vector>

namespace SecPolicyTool {

// Adds a line, without its end, to the messages that it belongs to: what stands behind "Error: " is
// a message of its own; any other line goes on with the last, in which a name holds a newline.
void AddMessageLine(std::vector<std::string>& messages, const std::string& line);

}  // namespace SecPolicyTool
