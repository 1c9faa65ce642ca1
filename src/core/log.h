// The doors to the system log, standard error and standard output.
#pragma once

#include <string>

#include "platform/tavon_exception.h"

namespace SecPolicy {

// Logs progress.
void LogInfo(const std::string& message);

// Writes an error to standard error and logs it. `failure` is the exception that the message is the
// text of; null for an error that no exception reports.
void LogError(const std::string& message, const Tavon::Lib::TavonException* failure);

// Writes one line to standard output and flushes it.
void PrintLine(const std::string& text);

}  // namespace SecPolicy
