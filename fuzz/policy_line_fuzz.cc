// The reader of policy lines: whatever the bytes, the words hold none of the separators, none is
// empty, and together they are the line before its comment without its spaces.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <string>

#include "secpolicy/secpolicy.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string line(data, data + size);
  std::string expected = line.substr(0, line.find('#'));
  std::erase(expected, ' ');
  std::string joined;
  for (auto words = SecPolicy::ParsePolicyLine(line); !words.empty(); words.pop()) {
    if (words.front().empty()) std::abort();
    joined += words.front();
  }
  if (joined != expected) std::abort();
  return 0;
}
