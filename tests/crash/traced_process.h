// Processes that stop before each of their system calls.
#pragma once

#include <sys/types.h>

#include <array>
#include <cstdint>
#include <functional>
#include <optional>
#include <set>
#include <string>

namespace CrashTest {

// A system call that a process is about to make.
struct PendingCall {
  pid_t process = 0;
  std::uint64_t number = 0;
  std::array<std::uint64_t, 6> arguments{};

  // The text at an address of the process, at most 255 bytes of it.
  [[nodiscard]] std::string TextAt(std::uint64_t address) const;
};

// A process and whatever it starts, traced. They are killed at the end of this object.
class TracedProcess {
 public:
  // Whether this process may trace others; in some containers it may not.
  static bool IsPermitted();

  // Forks and runs `body` there, which must not return.
  explicit TracedProcess(const std::function<void()>& body);
  ~TracedProcess() { Kill(); }
  TracedProcess(const TracedProcess&) = delete;
  TracedProcess& operator=(const TracedProcess&) = delete;

  // Lets them run on until one is about to make a call, at which it waits; nothing when all ended.
  std::optional<PendingCall> NextCall();

  // Lets them run to their end.
  void Finish();

  // Kills the one that waits before a call, alone.
  void KillWaiting() const;

  // Kills all of them where they are, and waits until none is left.
  void Kill();

  // The exit status of the first process; -1 when a signal ended it. To be asked when all ended.
  [[nodiscard]] int ExitStatus() const;

 private:
  void Resume(pid_t process, int signal);
  // Takes note of what waitpid said; true when the process stands before a call.
  bool Take(pid_t process, int status, PendingCall& call);

  pid_t first_;
  int status_ = 0;
  std::set<pid_t> running_;
  std::optional<pid_t> waiting_;
};

}  // namespace CrashTest
