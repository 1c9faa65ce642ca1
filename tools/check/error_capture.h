// Errors that a load reports, kept in the process that it runs in.
#pragma once

#include <sstream>
#include <string>
#include <vector>

namespace SecPolicyTool {

// Keeps what is written to std::cerr between Begin and End. One at a time.
class ErrorCapture {
 public:
  ErrorCapture() = default;
  ErrorCapture(const ErrorCapture&) = delete;
  ErrorCapture& operator=(const ErrorCapture&) = delete;
  ~ErrorCapture() { End(); }

  void Begin();
  // Does nothing a second time.
  void End();

  // An entry for each message: what stands behind "Error: ".
  [[nodiscard]] std::vector<std::string> Errors() const;

 private:
  std::ostringstream text_;
  std::streambuf* before_ = nullptr;
};

}  // namespace SecPolicyTool
