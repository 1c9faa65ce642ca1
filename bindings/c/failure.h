// How a function of the C interface fails.
#pragma once

#include <cstdint>
#include <exception>
#include <string>

#include "secpolicy/secpolicy_c.h"

namespace SecPolicyC {

// What a call returns, and says in its error.
struct Failure : std::exception {
  Failure(secpolicy_status failureStatus, std::string failureMessage)
      : status(failureStatus), message(std::move(failureMessage)) {}

  [[nodiscard]] const char* what() const noexcept override { return message.c_str(); }

  secpolicy_status status;
  std::string message;
  std::string file;  // empty for none
  std::uint32_t line = 0;
};

// The exception being handled, as a failure. Throws std::bad_alloc.
Failure CurrentFailure();

}  // namespace SecPolicyC
