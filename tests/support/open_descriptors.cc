#include "tests/support/open_descriptors.h"

#include <fcntl.h>

namespace SecPolicyTest {

namespace {

constexpr int kMostDescriptors = 1024;

}  // namespace

int OpenDescriptors() {
  int open = 0;
  for (int fd = 0; fd < kMostDescriptors; ++fd) open += fcntl(fd, F_GETFD) >= 0 ? 1 : 0;
  return open;
}

}  // namespace SecPolicyTest
