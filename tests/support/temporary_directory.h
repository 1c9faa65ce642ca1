// A directory for one test.
#pragma once

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

namespace StandIn {

// Made empty, and removed with everything in it.
class TemporaryDirectory {
 public:
  TemporaryDirectory() : path_(testing::TempDir() + "/host-image-XXXXXX") {
    if (::mkdtemp(path_.data()) == nullptr) {
      throw std::runtime_error("cannot make " + path_);
    }
  }
  ~TemporaryDirectory() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }
  TemporaryDirectory(const TemporaryDirectory&) = delete;
  TemporaryDirectory& operator=(const TemporaryDirectory&) = delete;

  [[nodiscard]] const std::string& Path() const { return path_; }
  [[nodiscard]] std::string operator/(const std::string& name) const { return path_ + "/" + name; }

 private:
  std::string path_;
};

inline void WriteBytes(const std::string& file, const std::string& bytes) {
  std::ofstream stream(file, std::ios::binary);
  stream << bytes;
  stream.close();
  if (!stream) {
    throw std::runtime_error("cannot write " + file);
  }
}

inline std::string ReadBytes(const std::string& file) {
  std::ifstream stream(file, std::ios::binary);
  if (!stream) {
    return "(" + file + " cannot be read)";
  }
  return {std::istreambuf_iterator<char>(stream), {}};
}

inline std::vector<std::string> NamesIn(const std::string& directory) {
  std::vector<std::string> names;
  for (const auto& entry : std::filesystem::directory_iterator(directory)) {
    names.push_back(entry.path().filename().string());
  }
  return names;
}

// What `call` says when it throws; a text of its own when it doesn't.
template <typename Error, typename Call>
std::string MessageOf(const Call& call) {
  try {
    call();
  } catch (const Error& error) {
    return error.what();
  }
  return "(nothing was thrown)";
}

}  // namespace StandIn
