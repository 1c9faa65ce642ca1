#include "tools/policy/output.h"

#include <iostream>
#include <stdexcept>

namespace SecPolicyTool {

void ReportError(const std::string& text) { std::cerr << "Error: " + text + "\n" << std::flush; }

void PrintJson(const nlohmann::json& content) {
  std::cout << content.dump(2, ' ', false, nlohmann::json::error_handler_t::replace) << "\n";
}

void FlushOutput() {
  if (!std::cout.flush()) throw std::runtime_error("standard output cannot be written");
}

}  // namespace SecPolicyTool
