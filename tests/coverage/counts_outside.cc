// Part of every program of a coverage build: has its counts written, wherever and however it ends.
//
// They are written when a process ends, to a file that the environment names. A process that
// entered a host has another root directory by then, one that ends by _exit writes nothing, and
// some tests forbid all writing.
#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cstdlib>

// The instrumentation's own. That the first is defined here leaves it to this file when the second
// is called, which has the counts written at the end: after what is registered later is done.
extern "C" {
// NOLINTBEGIN(bugprone-reserved-identifier): they are not this file's names to choose
int __llvm_profile_runtime = 0;
void __llvm_profile_initialize(void);
int __llvm_profile_write_file(void);
// NOLINTEND(bugprone-reserved-identifier)
}

namespace {

int outside = -1;

void ReturnOutside() {
  // Tests that run as another user add to the same files.
  umask(0);
  rlimit size{};
  getrlimit(RLIMIT_FSIZE, &size);
  size.rlim_cur = size.rlim_max;
  setrlimit(RLIMIT_FSIZE, &size);
  if (fchdir(outside) == 0 && chroot(".") != 0) static_cast<void>(chdir("/"));
}

__attribute__((constructor)) void RememberOutside() {
  outside = open("/", O_PATH | O_DIRECTORY | O_CLOEXEC);
  __llvm_profile_initialize();
  std::atexit(ReturnOutside);
}

}  // namespace

// In place of the C library's.
extern "C" void _exit(int status) {
  ReturnOutside();
  // Not twice: counts that are written are added to those in the file.
  static_cast<void>(__llvm_profile_write_file());
  for (;;) syscall(SYS_exit_group, status);
}
