// A directory that a fuzz target works in.
#pragma once

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <string>

namespace Fuzz {

// Made empty, in memory where the machine has such a place; removed with everything in it.
class ScratchDirectory {
 public:
  ScratchDirectory()
      : path_((std::filesystem::is_directory("/dev/shm") ? "/dev/shm" : "/tmp") +
              std::string("/secpolicy-fuzz-XXXXXX")) {
    if (::mkdtemp(path_.data()) == nullptr) throw std::runtime_error("cannot make " + path_);
  }
  ~ScratchDirectory() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }
  ScratchDirectory(const ScratchDirectory&) = delete;
  ScratchDirectory& operator=(const ScratchDirectory&) = delete;

  [[nodiscard]] const std::string& Path() const noexcept { return path_; }

 private:
  std::string path_;
};

inline void WriteFile(const std::string& path, const std::string& bytes) {
  std::ofstream stream(path, std::ios::binary | std::ios::trunc);
  stream << bytes;
  stream.close();
  if (!stream) throw std::runtime_error("cannot write " + path);
}

}  // namespace Fuzz
