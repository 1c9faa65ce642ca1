#include "host/image/beneath.h"

#include <fcntl.h>
#include <linux/openat2.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace StandIn {

UniqueFd OpenBeneath(int rootFd, const std::string& path, int flags) {
  const std::string relative = path == "/" ? "." : path.substr(1);
  struct open_how how {};
  how.flags = static_cast<__u64>(flags | O_CLOEXEC);
  how.resolve = RESOLVE_BENEATH | RESOLVE_NO_SYMLINKS | RESOLVE_NO_XDEV;
  // The C library has no function for this call.
  return UniqueFd(
      static_cast<int>(::syscall(SYS_openat2, rootFd, relative.c_str(), &how, sizeof how)));
}

}  // namespace StandIn
