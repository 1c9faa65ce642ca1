#include "bindings/c/barrier.h"

#include <ctime>

namespace SecPolicyC {

namespace {

sigset_t FileSizeSignal() {
  sigset_t signals;
  sigemptyset(&signals);
  sigaddset(&signals, SIGXFSZ);
  return signals;
}

bool IsPending() {
  sigset_t pending;
  return sigpending(&pending) == 0 && sigismember(&pending, SIGXFSZ) == 1;
}

}  // namespace

FileSizeSignalHeld::FileSizeSignalHeld() noexcept : wasPending_(IsPending()) {
  const sigset_t signals = FileSizeSignal();
  pthread_sigmask(SIG_BLOCK, &signals, &before_);
}

FileSizeSignalHeld::~FileSizeSignalHeld() {
  const sigset_t signals = FileSizeSignal();
  const timespec now{};
  if (!wasPending_ && IsPending()) sigtimedwait(&signals, nullptr, &now);
  pthread_sigmask(SIG_SETMASK, &before_, nullptr);
}

}  // namespace SecPolicyC
