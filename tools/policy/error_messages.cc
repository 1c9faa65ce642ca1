#include "tools/policy/error_messages.h"

#include <new>
#include <string_view>

namespace SecPolicyTool {

void AddMessageLine(std::vector<std::string>& messages, const std::string& line) {
  constexpr std::string_view kMark = "Error: ";
  if (line.starts_with(kMark)) {
    messages.push_back(line.substr(kMark.size()));
  } else if (messages.empty()) {
    messages.push_back(line);
  } else {
    messages.back() += "\n" + line;
  }
}

std::string MessageOf(const std::exception& failure) {
  return dynamic_cast<const std::bad_alloc*>(&failure) != nullptr ? "there is not enough memory"
                                                                  : failure.what();
}

}  // namespace SecPolicyTool
