// The one place that exceptions do not get past.
#pragma once

#include <pthread.h>
#include <signal.h>

#include "bindings/c/failure.h"

namespace SecPolicyC {

// Stores the exception being handled in `error`, unless that is NULL, and returns its status. When
// there is no memory for a description, that is what is described.
secpolicy_status Report(secpolicy_error** error) noexcept;

// Keeps this thread from being cancelled: its stack would be unwound through the caller's frames.
class Uncancelled {
 public:
  Uncancelled() noexcept { pthread_setcancelstate(PTHREAD_CANCEL_DISABLE, &before_); }
  ~Uncancelled() { pthread_setcancelstate(before_, nullptr); }
  Uncancelled(const Uncancelled&) = delete;
  Uncancelled& operator=(const Uncancelled&) = delete;

 private:
  int before_ = PTHREAD_CANCEL_ENABLE;
};

// Keeps a write beyond the limit of file sizes from ending the caller's process: it fails, and is
// reported like one on a full disk.
class FileSizeSignalHeld {
 public:
  FileSizeSignalHeld() noexcept;
  ~FileSizeSignalHeld();
  FileSizeSignalHeld(const FileSizeSignalHeld&) = delete;
  FileSizeSignalHeld& operator=(const FileSizeSignalHeld&) = delete;

 private:
  sigset_t before_{};
  bool wasPending_ = false;
};

// Calls `body` and turns what it throws into a status and an error.
template <typename Body>
secpolicy_status Guarded(secpolicy_error** error, const Body& body) noexcept {
  const Uncancelled uncancelled;
  const FileSizeSignalHeld held;
  if (error != nullptr) *error = nullptr;
  try {
    body();
    return SECPOLICY_OK;
  } catch (...) {
    return Report(error);
  }
}

}  // namespace SecPolicyC
