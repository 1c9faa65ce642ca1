// What the library's own code reports with, beyond the public functions.
#pragma once

#include <string>
#include <utility>

#include "core/log.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicy {

// file + ":" + line + " : " + cause: how a line of a policy file is named in front of its failure.
[[nodiscard]] std::string AtLine(const std::string& file, unsigned int line,
                                 const std::string& cause);

// strerror of errno as it is now.
[[nodiscard]] std::string SystemReason();

// Runs one item of a stage. A TavonException is logged with SecpolicyError and answered with false,
// so that the stage goes on with its next item; every other exception passes through.
template <typename Item>
[[nodiscard]] bool SucceedsOrLogs(Item&& item) {
  try {
    std::forward<Item>(item)();
    return true;
  } catch (const Tavon::Lib::TavonException& failure) {
    LogError(failure.what(), &failure);
    return false;
  }
}

// Logs one of two summaries, a failure as an error.
void LogSummary(bool succeeded, const char* success, const char* failure);

}  // namespace SecPolicy
