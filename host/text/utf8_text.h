// Text from outside, which may hold any bytes, as UTF-8.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace StandIn {

// A character: its number of bytes, 1 to 4, and its code point. 0 bytes: none, see FirstCharacter.
struct Character {
  std::size_t bytes = 0;
  char32_t point = 0;
};

// The character at the start of `text`, which is not empty; of 0 bytes when the first byte does not
// begin one in valid UTF-8.
Character FirstCharacter(std::string_view text);

// How many bytes it has.
std::size_t CharacterBytes(std::string_view text);

// The number of characters, each byte that belongs to none counting as one.
std::size_t CharacterCount(std::string_view text);

// The first characters of valid UTF-8 and "…" when it has more than `most`, else `text`.
std::string Shortened(const std::string& text, std::size_t most);

// `text` with U+FFFD in place of each byte that belongs to no character.
std::string ValidText(std::string_view text);

}  // namespace StandIn
