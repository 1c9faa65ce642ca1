// The lines of policy files.
#pragma once

#include <array>
#include <cstddef>
#include <fstream>
#include <optional>
#include <string>
#include <string_view>

#include "core/file_access.h"
#include "core/policy_lines.h"

namespace SecPolicy {

// An open file that is read line by line; closed with this object.
class LineReader {
 public:
  // Opens the policy file `path`; where that fails, IsOpen() is false.
  explicit LineReader(const std::string& path) : file_(OpenPolicyFile(path)) {}

  LineReader(const LineReader&) = delete;
  LineReader& operator=(const LineReader&) = delete;

  [[nodiscard]] bool IsOpen() const { return file_.is_open(); }

  // The next line without its end, up to its first NUL byte; valid until the next call. Nothing at
  // the end. A line of more than kLongestLine characters is cut there and is the last one; so is
  // what precedes a read error, which is not told apart from the end.
  std::optional<std::string_view> Next();

 private:
  // Brings the rest of a line to the front and reads behind it, or notes that the end was reached.
  void Refill();
  std::size_t ReadBehind(std::size_t kept);

  std::filebuf file_;
  std::array<char, 8192> block_;
  std::string_view unread_;  // in block_
  bool isAtEnd_ = false;
};

}  // namespace SecPolicy
