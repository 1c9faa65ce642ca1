#include "tools/kernel/permission.h"

#include <stdexcept>

#include "host/module/permission_letters.h"
#include "host/module/rule.h"

namespace SecPolicyTool {

namespace {

constexpr char kNone[] = "-";

[[noreturn]] void Refuse(const std::string& letters) {
  throw std::invalid_argument(
      "\"" + letters +
      R"(" is no permission: it takes letters of "rwx", each once, or "-" for none)");
}

std::uint32_t BitOf(char letter, const std::string& letters) {
  for (const StandIn::PermissionBit& known : StandIn::kPermissionBits) {
    if (known.letter == letter) return known.bit;
  }
  Refuse(letters);
}

}  // namespace

std::uint32_t ParsePermission(const std::string& letters) {
  if (letters == kNone) return 0;
  if (letters.empty()) Refuse(letters);
  std::uint32_t permission = 0;
  for (const char letter : letters) {
    const std::uint32_t bit = BitOf(letter, letters);
    if ((permission & bit) != 0) Refuse(letters);
    permission |= bit;
  }
  return permission;
}

std::string PermissionText(std::uint32_t permission) {
  const std::string letters = StandIn::PermissionLetters(permission);
  return letters.empty() ? kNone : letters;
}

}  // namespace SecPolicyTool
