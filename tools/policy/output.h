// What the command tells its user.
#pragma once

#include <exception>
#include <nlohmann/json_fwd.hpp>
#include <string>

namespace SecPolicyTool {

// "Error: " + text on standard error: the form in which the library reports, too. Escaped where
// that is a terminal (see PrintLine), so that `text` may hold any bytes.
void ReportError(const std::string& text);

// What the user is told of a failure: its text, or for a std::bad_alloc, whose own text says
// nothing to anyone but programmers, "there is not enough memory".
std::string MessageOf(const std::exception& failure);

// `content` as lines of text, indented. Bytes that are not UTF-8, which JSON cannot hold, are
// replaced by U+FFFD.
std::string TextOfJson(const nlohmann::json& content);

// Prints that to standard output.
void PrintJson(const nlohmann::json& content);

// Flushes standard output; throws std::runtime_error when something of it could not be written, so
// that a full disk does not pass for success.
void FlushOutput();

}  // namespace SecPolicyTool
