#include "tools/check/error_capture.h"

#include <iostream>
#include <string_view>

namespace SecPolicyTool {

void ErrorCapture::Begin() { before_ = std::cerr.rdbuf(text_.rdbuf()); }

void ErrorCapture::End() {
  if (before_ == nullptr) return;
  std::cerr.rdbuf(before_);
  before_ = nullptr;
}

std::vector<std::string> ErrorCapture::Errors() const {
  constexpr std::string_view kMark = "Error: ";
  std::vector<std::string> errors;
  std::istringstream lines(text_.str());
  for (std::string line; std::getline(lines, line);) {
    if (line.starts_with(kMark)) {
      errors.push_back(line.substr(kMark.size()));
    } else if (!errors.empty()) {
      // A name in the message holds a newline.
      errors.back() += "\n" + line;
    }
  }
  return errors;
}

}  // namespace SecPolicyTool
