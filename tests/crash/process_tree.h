// Processes that are started to be killed.
#pragma once

#include <sys/types.h>

#include <functional>

namespace CrashTest {

// A process and whatever it starts. They are killed at the end of this object, at the latest.
class ProcessTree {
 public:
  // Forks and runs `body` there, which must not return.
  explicit ProcessTree(const std::function<void()>& body);
  ~ProcessTree() { Kill(); }
  ProcessTree(const ProcessTree&) = delete;
  ProcessTree& operator=(const ProcessTree&) = delete;

  // Kills all of them at once, and waits until none is left.
  void Kill();

  // Waits until all have ended by themselves; what waitpid says of the first.
  int Wait();

 private:
  pid_t first_;
};

}  // namespace CrashTest
