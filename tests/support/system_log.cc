#include "tests/support/system_log.h"

#include <syslog.h>
#include <unistd.h>

#include <cstdarg>
#include <cstdio>
#include <string>

namespace {

int capturedTo = -1;
SecPolicyTest::LogSink capturedBy = nullptr;

std::string PriorityWord(int priority) {
  switch (priority) {
    case LOG_INFO:
      return "info";
    case LOG_ERR:
      return "error";
    default:
      return std::to_string(priority);
  }
}

void Keep(int priority, const char* message) {
  if (capturedBy != nullptr) return capturedBy(priority, message);
  dprintf(capturedTo, "%s: %s\n", PriorityWord(priority).c_str(), message);
}

}  // namespace

namespace SecPolicyTest {

void CaptureSystemLog(int fd) { capturedTo = fd; }
void CaptureSystemLog(LogSink sink) { capturedBy = sink; }

}  // namespace SecPolicyTest

// Stands before the C library's function of this name, so that the library under test needs no
// seam for its logging and the format and priority that it really uses are seen.
extern "C" void syslog(int priority, const char* format, ...) {
  va_list arguments;
  va_start(arguments, format);
  if (capturedTo < 0 && capturedBy == nullptr) {
    vsyslog(priority, format, arguments);
  } else {
    char* text = nullptr;
    if (vasprintf(&text, format, arguments) >= 0) {
      Keep(priority, text);
      free(text);
    }
  }
  va_end(arguments);
}
