// How a function of the C interface fails.
#pragma once

#include <cstdint>
#include <exception>
#include <string>
#include <utility>

#include "secpolicy/secpolicy_c.h"

namespace SecPolicyC {

// What a call returns, and says in its error.
struct Failure : std::exception {
  Failure(secpolicy_status failureStatus, std::string failureMessage, std::string failureFile = {},
          std::uint32_t failureLine = 0)
      : status(failureStatus),
        message(std::move(failureMessage)),
        file(std::move(failureFile)),
        line(failureLine) {}

  [[nodiscard]] const char* what() const noexcept override { return message.c_str(); }

  secpolicy_status status;
  std::string message;
  std::string file;  // empty for none
  std::uint32_t line;
};

// The exception being handled, as a failure. Throws std::bad_alloc.
Failure CurrentFailure();

}  // namespace SecPolicyC
