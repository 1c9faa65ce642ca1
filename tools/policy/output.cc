#include "tools/policy/output.h"

#include <iostream>
#include <new>
#include <nlohmann/json.hpp>
#include <stdexcept>

#include "tools/policy/terminal.h"

namespace SecPolicyTool {

void ReportError(const std::string& text) { PrintLine(std::cerr, "Error: " + text); }

std::string MessageOf(const std::exception& failure) {
  return dynamic_cast<const std::bad_alloc*>(&failure) != nullptr ? "there is not enough memory"
                                                                  : failure.what();
}

std::string TextOfJson(const nlohmann::json& content) {
  return content.dump(2, ' ', false, nlohmann::json::error_handler_t::replace) + "\n";
}

void PrintJson(const nlohmann::json& content) { std::cout << TextOfJson(content); }

void FlushOutput() {
  if (!std::cout.flush()) throw std::runtime_error("standard output cannot be written");
}

}  // namespace SecPolicyTool
