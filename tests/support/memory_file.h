// A file that has a path and no place on any disk.
#pragma once

#include <sys/mman.h>
#include <unistd.h>

#include <stdexcept>
#include <string>

#include "host/files/unique_fd.h"

namespace SecPolicyTest {

// Made empty; vanishes with this object. The path is good in this process only.
class MemoryFile {
 public:
  MemoryFile() : fd_(memfd_create("policy", MFD_CLOEXEC)) {
    if (!fd_.IsOpen()) throw std::runtime_error("no file in memory could be made");
    path_ = "/proc/self/fd/" + std::to_string(fd_.Get());
  }

  [[nodiscard]] const std::string& Path() const noexcept { return path_; }
  [[nodiscard]] int Descriptor() const noexcept { return fd_.Get(); }

  // Replaces the content and goes back to its start.
  void Write(const std::string& bytes) {
    const bool isWritten =
        ftruncate(fd_.Get(), 0) == 0 &&
        pwrite(fd_.Get(), bytes.data(), bytes.size(), 0) == static_cast<ssize_t>(bytes.size()) &&
        lseek(fd_.Get(), 0, SEEK_SET) == 0;
    if (!isWritten) throw std::runtime_error("a file in memory could not be written");
  }

 private:
  StandIn::UniqueFd fd_;
  std::string path_;
};

}  // namespace SecPolicyTest
