#include "tests/crash/save_calls.h"

#include <fcntl.h>
#include <sys/syscall.h>

#include <map>

namespace CrashTest {

bool BeginsSave(const PendingCall& call) {
  return call.number == SYS_openat && (call.arguments[2] & O_CREAT) != 0 &&
         call.TextAt(call.arguments[1]).starts_with("kernel.json");
}

std::string NameOf(const PendingCall& call) {
  static const std::map<std::uint64_t, std::string> kNames = {
      {SYS_openat, "open"},     {SYS_write, "write"},      {SYS_fsync, "fsync"},
      {SYS_renameat, "rename"}, {SYS_renameat2, "rename"}, {SYS_unlinkat, "unlink"},
      {SYS_close, "close"},     {SYS_fcntl, "lock"},       {SYS_exit_group, "exit"},
  };
  const auto found = kNames.find(call.number);
  return found != kNames.end() ? found->second : "call " + std::to_string(call.number);
}

std::optional<PendingCall> SaveCalls::Next() {
  while (auto call = process_.NextCall()) {
    if (!saver_ && BeginsSave(*call)) saver_ = call->process;
    if (saver_ == call->process) return call;
  }
  return std::nullopt;
}

}  // namespace CrashTest
