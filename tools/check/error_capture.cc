#include "tools/check/error_capture.h"

#include <iostream>

#include "tools/policy/error_messages.h"

namespace SecPolicyTool {

void ErrorCapture::Begin() { before_ = std::cerr.rdbuf(text_.rdbuf()); }

void ErrorCapture::End() {
  if (before_ == nullptr) return;
  std::cerr.rdbuf(before_);
  before_ = nullptr;
}

std::vector<std::string> ErrorCapture::Errors() const {
  std::vector<std::string> errors;
  std::istringstream lines(text_.str());
  for (std::string line; std::getline(lines, line);) AddMessageLine(errors, line);
  return errors;
}

}  // namespace SecPolicyTool
