// Names from archives, directories and documents in messages.
#pragma once

#include <string>

namespace StandIn {

// `name` in double quotes, as it may be shown on a terminal: escaped as by Escaped, quotes and
// backslashes too; of more than 255 bytes only the first 255 and "..." are shown.
std::string QuotedName(const std::string& name);

}  // namespace StandIn
