#include "core/log.h"

#include <syslog.h>

#include <iostream>

namespace SecPolicy {

void LogInfo(const std::string& message) { syslog(LOG_INFO, "%s", message.c_str()); }

void LogError(const std::string& message, const Tavon::Lib::TavonException*) {
  // In one piece, so that lines of several processes do not mix.
  std::cerr << "Error: " + message + "\n" << std::flush;
  syslog(LOG_ERR, "Error: %s", message.c_str());
}

void PrintLine(const std::string& text) { std::cout << text << std::endl; }

}  // namespace SecPolicy
