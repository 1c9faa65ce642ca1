#include "kernel/path_resolution.h"

#include <sys/prctl.h>

namespace SecPolicy {

bool ResolvePath(const std::string& path, ZekAccess_FileRule& rule) {
  return prctl(ZekCtl::Kernel::kPrctlResolvePath, path.c_str(), rule.path) == 0;
}

}  // namespace SecPolicy
