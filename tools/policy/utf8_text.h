// Text of policy files, which may hold any bytes, as UTF-8.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace SecPolicyTool {

// How many bytes at the start of `text`, which is not empty, make a character: 1 to 4 of valid
// UTF-8, or 0 for a byte that does not belong to any.
std::size_t CharacterBytes(std::string_view text);

// The number of characters, each byte that belongs to none counting as one.
std::size_t CharacterCount(std::string_view text);

// `text` with U+FFFD in place of each byte that belongs to no character.
std::string ValidText(std::string_view text);

}  // namespace SecPolicyTool
