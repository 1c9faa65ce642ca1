#include "tools/check/permission_words.h"

#include <cstdint>

#include "host/module/rule.h"

namespace SecPolicyTool {

namespace {

const char* NameOf(char letter) {
  return letter == 'r' ? "Read" : letter == 'w' ? "Write" : "Exec";
}

std::uint32_t BitOf(char letter) {
  for (const StandIn::PermissionBit& known : StandIn::kPermissionBits) {
    if (known.letter == letter) return known.bit;
  }
  return 0;
}

}  // namespace

std::string PermissionProblem(const std::string& letters) {
  if (letters.size() > StandIn::kPermissionBits.size()) {
    return "Please enter the permissions from [rwx].";
  }
  std::uint32_t bits = 0;
  for (const char letter : letters) {
    const std::uint32_t bit = BitOf(letter);
    if (bit == 0) return "Unknown access privilege specified.";
    if ((bits & bit) != 0) return std::string(NameOf(letter)) + " access already specified.";
    bits |= bit;
  }
  return {};
}

}  // namespace SecPolicyTool
