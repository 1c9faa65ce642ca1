// Messages on standard error, as the library and ReportError write them.
#pragma once

#include <exception>
#include <string>
#include <vector>

namespace SecPolicyTool {

// Adds a line, without its end, to the messages that it belongs to: what stands behind "Error: " is
// a message of its own; any other line goes on with the last, in which a name holds a newline.
void AddMessageLine(std::vector<std::string>& messages, const std::string& line);

// What the user is told of a failure: its text, or for a std::bad_alloc, whose own text says
// nothing to anyone but programmers, "there is not enough memory".
std::string MessageOf(const std::exception& failure);

}  // namespace SecPolicyTool
