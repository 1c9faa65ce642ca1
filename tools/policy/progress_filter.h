// Progress of the library on the terminal.
#pragma once

#include <string>

namespace SecPolicyTool {

// Sends what the process logs to the system log, and a copy of it to standard error, in the form
// that FilterProgress reads. Call it before the root directory changes: the connection to the
// system log stays.
void OpenProgressLog();

// Turns one line of standard error, written under OpenProgressLog, into what the user is to see:
// logged progress without the log's prefix; nothing for a logged error, which stands there already;
// any other line as it is. Returns false for nothing.
bool FilterProgress(std::string& line);

}  // namespace SecPolicyTool
