// Statuses and errors of the C interface.
#include <array>
#include <string>

#include "bindings/c/barrier.h"
#include "host/text/utf8_text.h"

struct secpolicy_error {
  secpolicy_status status;
  std::string message;
  std::string file;
  std::uint32_t line;
};

namespace SecPolicyC {

namespace {

// There before it is needed. Its text is short enough to need no memory of its own.
secpolicy_error outOfMemory{SECPOLICY_OUT_OF_MEMORY, "out of memory", {}, 0};

secpolicy_status Store(const Failure& failure, secpolicy_error** error) {
  const secpolicy_status status = failure.status;
  if (error != nullptr) {
    // Messages name files and words as they are, which may be any bytes.
    *error = new secpolicy_error{status, StandIn::ValidText(failure.message),
                                 StandIn::ValidText(failure.file), failure.line};
  }
  return status;
}

}  // namespace

secpolicy_status Report(secpolicy_error** error) noexcept {
  try {
    return Store(CurrentFailure(), error);
  } catch (...) {
    if (error != nullptr) *error = &outOfMemory;
    return SECPOLICY_OUT_OF_MEMORY;
  }
}

}  // namespace SecPolicyC

extern "C" {

const char* secpolicy_status_name(secpolicy_status status) {
  static constexpr std::array kNames{"SECPOLICY_OK",
                                     "SECPOLICY_INVALID_ARGUMENT",
                                     "SECPOLICY_BAD_REQUEST",
                                     "SECPOLICY_FAILED",
                                     "SECPOLICY_LOAD_FAILED",
                                     "SECPOLICY_LOAD_TERMINATED",
                                     "SECPOLICY_OUT_OF_MEMORY",
                                     "SECPOLICY_SYSTEM"};
  const auto index = static_cast<std::size_t>(status);
  return index < kNames.size() ? kNames[index] : "unknown";
}

secpolicy_status secpolicy_error_status(const secpolicy_error* error) {
  return error == nullptr ? SECPOLICY_OK : error->status;
}

const char* secpolicy_error_message(const secpolicy_error* error) {
  return error == nullptr ? "" : error->message.c_str();
}

const char* secpolicy_error_file(const secpolicy_error* error) {
  return error == nullptr || error->file.empty() ? nullptr : error->file.c_str();
}

uint32_t secpolicy_error_line(const secpolicy_error* error) {
  return error == nullptr ? 0 : error->line;
}

void secpolicy_error_free(secpolicy_error* error) {
  if (error != &SecPolicyC::outOfMemory) delete error;
}

}  // extern "C"
