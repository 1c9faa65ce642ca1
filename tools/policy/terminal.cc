#include "tools/policy/terminal.h"

#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <string_view>

#include "tools/policy/utf8_text.h"

namespace SecPolicyTool {

namespace {

std::string_view Variable(const char* name) {
  const char* value = std::getenv(name);
  return value == nullptr ? "" : value;
}

}  // namespace

bool WantsColour(int descriptor) {
  return Variable("NO_COLOR").empty() && Variable("TERM") != "dumb" && isatty(descriptor) == 1;
}

std::string Painter::Paint(Colour colour, const std::string& text) const {
  static constexpr std::array kCodes{"31", "33", "32", "36", "1"};
  if (!isColoured_) return text;
  return std::string("\x1b[") + kCodes.at(static_cast<std::size_t>(colour)) + "m" + text +
         "\x1b[0m";
}

namespace {

std::string Escaped(std::string_view bytes) {
  constexpr char kHex[] = "0123456789abcdef";
  std::string text;
  for (const char c : bytes) {
    const auto byte = static_cast<unsigned char>(c);
    text += std::string("\\x") + kHex[byte >> 4] + kHex[byte & 0xF];
  }
  return text;
}

bool IsPlain(char c) { return c >= ' ' && c <= '~'; }

// C1 control characters, which are two bytes in UTF-8, mean something to some terminals.
bool IsControl(std::string_view character) {
  if (character.size() == 1) return !IsPlain(character[0]);
  return character.size() == 2 && character[0] == '\xC2' &&
         static_cast<unsigned char>(character[1]) < 0xA0;
}

}  // namespace

std::string Printable(std::string_view text) {
  if (std::all_of(text.begin(), text.end(), IsPlain)) return std::string(text);
  std::string shown;
  while (!text.empty()) {
    const std::size_t bytes = CharacterBytes(text);
    const std::string_view part = text.substr(0, std::max<std::size_t>(1, bytes));
    shown += bytes == 0 || IsControl(part) ? Escaped(part) : std::string(part);
    text.remove_prefix(part.size());
  }
  return shown;
}

}  // namespace SecPolicyTool
