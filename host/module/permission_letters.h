// Permission bits as the letters of policy files.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace StandIn {

// The letters of the bits, in the order of kPermissionBits; empty for no bit.
std::string PermissionLetters(std::uint32_t permission);

// The bits of letters that are each known and stand in that order; nothing for any other text.
std::optional<std::uint32_t> PermissionOfLetters(const std::string& letters);

}  // namespace StandIn
