// What a forked child makes of the state that it inherits.
#pragma once

#include <chrono>
#include <vector>

namespace SecPolicyC {

// Gives every signal its default action, but for those that are ignored, as a new program has them,
// and blocks none. SIGALRM and SIGCHLD have theirs even when they were ignored.
void TakeDefaultSignals();

// Takes and gives back the locks of the C library that the work needs and that may be another
// thread's for good, since a child has none: those of the system log, of time zones, of locales and
// of the list of loaded libraries. The process is killed by SIGALRM when it has not got them in
// time. Then the connection to the system log is closed, and the locale is the classic one, in
// which messages are read.
void TakeFreeLocks(std::chrono::milliseconds patience);

// Makes the standard streams /dev/null and closes all descriptors but `kept`, which are others.
// What is written to std::cerr goes to standard error, also where the caller had it go elsewhere.
// Throws std::system_error when there is no /dev/null.
void TakeOwnDescriptors(std::vector<int> kept);

}  // namespace SecPolicyC
