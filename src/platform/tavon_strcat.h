// The control library's joining of strings.
#pragma once

#include <concepts>
#include <string>
#include <string_view>

namespace Tavon::Misc {

namespace Internal {

// Text is taken as it is.
inline void Append(std::string& text, std::string_view part) { text.append(part); }

// A character is text, not a number.
inline void Append(std::string& text, char part) { text.push_back(part); }

// Decimal, without regard to the global locale: messages read the same in every process.
template <std::integral Number>
void Append(std::string& text, Number part) {
  text.append(std::to_string(part));
}

}  // namespace Internal

// The parts, one behind the other with nothing between them: strings as they are, characters as
// themselves, integers in decimal. No part gives an empty string.
template <typename... Parts>
[[nodiscard]] std::string StrCat(const Parts&... parts) {
  std::string text;
  (Internal::Append(text, parts), ...);
  return text;
}

}  // namespace Tavon::Misc
