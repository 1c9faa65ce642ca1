#include "tools/policy/library_output.h"

#include <syslog.h>

#include <iostream>

#include "tools/policy/output.h"

namespace SecPolicyTool {

void LogProgress(const std::string& message) { syslog(LOG_INFO, "%s", message.c_str()); }

void LogFailure(const std::string& message) { syslog(LOG_ERR, "Error: %s", message.c_str()); }

SystemLog::SystemLog() { openlog("secpolicy", 0, LOG_USER); }

void SystemLog::OnInfo(const std::string& message) { LogProgress(message); }

void SystemLog::OnError(const std::string& message, const Tavon::Lib::TavonException*) {
  ReportError(message);
  LogFailure(message);
}

void SystemLog::OnPrint(const std::string& line) { std::cout << line << '\n'; }

}  // namespace SecPolicyTool
