#include "labels/security_attribute.h"

#include <sys/xattr.h>

#include "platform/private_calls.h"

namespace SecPolicy {

using ZekCtl::Kernel::kLabelAttribute;

int ReplaceLabelId(const std::string& path, std::uint32_t id) {
  // Replace only: a file that the platform gave no label is not one that policy may label.
  return setxattr(path.c_str(), kLabelAttribute, &id, sizeof id, XATTR_REPLACE);
}

std::optional<std::uint32_t> ReadLabelId(const std::string& path) {
  std::uint32_t id = 0;
  if (getxattr(path.c_str(), kLabelAttribute, &id, sizeof id) < 0) return std::nullopt;
  return id;
}

}  // namespace SecPolicy
