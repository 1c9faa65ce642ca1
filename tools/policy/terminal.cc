#include "tools/policy/terminal.h"

#include <unistd.h>

#include <array>
#include <cstdlib>
#include <string_view>

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

std::string Printable(const std::string& text) {
  constexpr char kHex[] = "0123456789abcdef";
  std::string shown;
  for (const char c : text) {
    const auto byte = static_cast<unsigned char>(c);
    if (byte >= 0x20 && byte != 0x7F) {
      shown += c;
    } else {
      shown += std::string("\\x") + kHex[byte >> 4] + kHex[byte & 0xF];
    }
  }
  return shown;
}

}  // namespace SecPolicyTool
