// What the tests' process logs.
#pragma once

namespace SecPolicyTest {

// From here on, what this process sends to the system log goes to the file `fd` instead, a line a
// message: "info: " or "error: " and the message; other priorities by their number.
void CaptureSystemLog(int fd);

// From here on, each message goes to `sink` instead.
using LogSink = void (*)(int priority, const char* message);
void CaptureSystemLog(LogSink sink);

}  // namespace SecPolicyTest
