// A disk that fails where a test wants it to.
#pragma once

#include <cstddef>

namespace CrashTest {

// From here on, in this process: write and fsync as the program's own code calls them. What is not
// mentioned works. Until the end of this object.
class FailingDisk {
 public:
  struct Faults {
    std::size_t bytesAtATime = 0;  // that a write takes at most; 0 for all
    int failingWrite = 0;          // the number of the write that fails, from 1
    int failingSync = 0;           // the number of the fsync that fails, from 1
    int number = 0;                // the errno of both
  };
  explicit FailingDisk(const Faults& faults);
  ~FailingDisk();
  FailingDisk(const FailingDisk&) = delete;
  FailingDisk& operator=(const FailingDisk&) = delete;
};

}  // namespace CrashTest
