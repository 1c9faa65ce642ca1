#include "tests/crash/failing_disk.h"

#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <optional>

namespace CrashTest {

namespace {

std::optional<FailingDisk::Faults> active;
int writes = 0;
int syncs = 0;

}  // namespace

FailingDisk::FailingDisk(const Faults& faults) {
  writes = 0;
  syncs = 0;
  active = faults;
}

FailingDisk::~FailingDisk() { active.reset(); }

}  // namespace CrashTest

// In place of the C library's, for everything that is linked into this program.
extern "C" ssize_t write(int fd, const void* bytes, std::size_t size) {
  using namespace CrashTest;
  if (active && ++writes == active->failingWrite) {
    errno = active->number;
    return -1;
  }
  if (active && active->bytesAtATime != 0) size = std::min(size, active->bytesAtATime);
  return syscall(SYS_write, fd, bytes, size);
}

extern "C" int fsync(int fd) {
  using namespace CrashTest;
  if (active && ++syncs == active->failingSync) {
    errno = active->number;
    return -1;
  }
  return static_cast<int>(syscall(SYS_fsync, fd));
}
