// Names from archives and directories in messages.
#pragma once

#include <string>

namespace StandIn {

// `name` in double quotes, as it may be shown on a terminal: control characters, quotes and
// backslashes are written as \xNN, and of more than 255 bytes only the first 255 and "..." are
// shown.
std::string QuotedName(const std::string& name);

}  // namespace StandIn
