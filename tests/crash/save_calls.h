// The system calls by which a traced process keeps the kernel's state.
#pragma once

#include <functional>
#include <optional>
#include <string>

#include "tests/crash/traced_process.h"

namespace CrashTest {

// "open", "write", "fsync", "rename", "unlink", "close", "lock", "exit"; else the call's number.
std::string NameOf(const PendingCall& call);

// Whether the call makes the file that is to become kernel.json.
bool BeginsSave(const PendingCall& call);

// A traced process and whatever it starts, which run freely up to a save.
class SaveCalls {
 public:
  explicit SaveCalls(const std::function<void()>& body) : process_(body) {}

  // The next call, beginning with that which makes the new file, of the process that saves.
  // Nothing when all have ended.
  std::optional<PendingCall> Next();

  // As those of TracedProcess.
  void Finish() { process_.Finish(); }
  void Kill() { process_.Kill(); }
  void KillWaiting() const { process_.KillWaiting(); }
  [[nodiscard]] int ExitStatus() const { return process_.ExitStatus(); }

 private:
  TracedProcess process_;
  std::optional<pid_t> saver_;
};

}  // namespace CrashTest
