#include "tests/crash/process_tree.h"

#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <stdexcept>

namespace CrashTest {

ProcessTree::ProcessTree(const std::function<void()>& body) {
  std::fflush(nullptr);
  first_ = fork();
  if (first_ < 0) throw std::runtime_error("cannot fork");
  if (first_ == 0) {
    setpgid(0, 0);
    body();
    _exit(126);
  }
  setpgid(first_, first_);  // whichever of the two comes first
}

void ProcessTree::Kill() {
  if (first_ == 0) return;
  kill(-first_, SIGKILL);
  Wait();
}

// Those that lost their parent are this process's children now (see main.cc).
int ProcessTree::Wait() {
  int ofFirst = 0;
  int status = 0;
  for (;;) {
    const pid_t ended = waitpid(-first_, &status, 0);
    if (ended == first_) ofFirst = status;
    if (ended < 0 && errno != EINTR) break;
  }
  first_ = 0;
  return ofFirst;
}

}  // namespace CrashTest
