#include "host/module/permission_letters.h"

#include "host/module/rule.h"

namespace StandIn {

std::string PermissionLetters(std::uint32_t permission) {
  std::string letters;
  for (const PermissionBit& known : kPermissionBits) {
    if ((permission & known.bit) != 0) {
      letters += known.letter;
    }
  }
  return letters;
}

std::optional<std::uint32_t> PermissionOfLetters(const std::string& letters) {
  std::uint32_t permission = 0;
  for (const PermissionBit& known : kPermissionBits) {
    if (letters.find(known.letter) != std::string::npos) {
      permission |= known.bit;
    }
  }
  // Only the letters in their order, each once, are written as they were read.
  return PermissionLetters(permission) == letters ? std::optional(permission) : std::nullopt;
}

}  // namespace StandIn
