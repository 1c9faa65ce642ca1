#include "host/text/escaped.h"

#include <algorithm>
#include <array>

#include "host/text/utf8_text.h"

namespace StandIn {

namespace {

struct CodePoints {
  char32_t first;
  char32_t last;
};

// Beyond ASCII: C1 controls, line and paragraph separators, the characters for bidirectional text,
// those that Unicode calls ignorable by default, which are not seen, and two that are no
// characters, which XML does not take.
constexpr std::array<CodePoints, 20> kUnsafe{{
    {0x80, 0x9F},       {0xAD, 0xAD},       {0x34F, 0x34F},     {0x61C, 0x61C},
    {0x115F, 0x1160},   {0x17B4, 0x17B5},   {0x180B, 0x180F},   {0x200B, 0x200F},
    {0x2028, 0x202E},   {0x2060, 0x206F},   {0x3164, 0x3164},   {0xFE00, 0xFE0F},
    {0xFEFF, 0xFEFF},   {0xFFA0, 0xFFA0},   {0xFFF0, 0xFFFB},   {0xFFFE, 0xFFFF},
    {0x13430, 0x1343F}, {0x1BCA0, 0x1BCA3}, {0x1D173, 0x1D17A}, {0xE0000, 0xE0FFF},
}};

bool IsSafe(char32_t point) {
  if (point < 0x80) return point >= ' ' && point <= '~';
  return std::none_of(kUnsafe.begin(), kUnsafe.end(), [&](const CodePoints& range) {
    return point >= range.first && point <= range.last;
  });
}

bool IsPlain(char c) { return c >= ' ' && c <= '~'; }

}  // namespace

void AppendEscaped(std::string& text, char byte) {
  constexpr char kHex[] = "0123456789abcdef";
  const auto value = static_cast<unsigned char>(byte);
  text += {'\\', 'x', kHex[value >> 4], kHex[value & 0xF]};
}

Escaped::Escaped(std::string_view bytes) {
  if (std::all_of(bytes.begin(), bytes.end(), IsPlain)) {
    text_ = bytes;
    return;
  }
  while (!bytes.empty()) {
    const Character character = FirstCharacter(bytes);
    const std::string_view part = bytes.substr(0, std::max<std::size_t>(1, character.bytes));
    if (character.bytes != 0 && IsSafe(character.point)) {
      text_ += part;
    } else {
      for (const char byte : part) AppendEscaped(text_, byte);
    }
    bytes.remove_prefix(part.size());
  }
}

}  // namespace StandIn
