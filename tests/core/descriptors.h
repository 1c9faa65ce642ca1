// What is left open.
#pragma once

#include <fcntl.h>
#include <unistd.h>

namespace SecPolicyTest {

// The number that the next descriptor gets; the same before and after what leaves none open.
inline int LowestFreeDescriptor() {
  const int descriptor = open("/", O_RDONLY | O_CLOEXEC);
  close(descriptor);
  return descriptor;
}

}  // namespace SecPolicyTest
