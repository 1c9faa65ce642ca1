#include "host/root/openat2.h"

#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>

namespace StandIn {

UniqueFd Openat2(int at, const std::string& path, int flags, std::uint64_t resolve) {
  static std::atomic<bool> isMissing = false;
  if (isMissing.load(std::memory_order_relaxed)) {
    errno = ENOSYS;
    return {};
  }
  struct open_how how {};
  how.flags = static_cast<__u64>(flags | O_CLOEXEC);
  how.resolve = resolve;
  UniqueFd fd(static_cast<int>(::syscall(SYS_openat2, at, path.c_str(), &how, sizeof how)));
  if (!fd.IsOpen() && errno == ENOSYS) isMissing.store(true, std::memory_order_relaxed);
  return fd;
}

}  // namespace StandIn
