#include "tools/secpolicy/output.h"

#include <iostream>
#include <stdexcept>

namespace SecPolicyTool {

void ReportError(const std::string& text) { std::cerr << "Error: " + text + "\n" << std::flush; }

void FlushOutput() {
  if (!std::cout.flush()) throw std::runtime_error("standard output cannot be written");
}

}  // namespace SecPolicyTool
