#include "tools/report/visible_text.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <string_view>

namespace SecPolicyTool {

namespace {

struct Range {
  char32_t first;
  char32_t last;
};

// Controls, soft hyphen, zero widths, marks and overrides of direction, separators of lines,
// invisible operators, byte-order mark, annotations, tags.
constexpr std::array<Range, 12> kUnseen{{{0x00, 0x1F},
                                         {0x7F, 0x9F},
                                         {0xAD, 0xAD},
                                         {0x61C, 0x61C},
                                         {0x180E, 0x180E},
                                         {0x200B, 0x200F},
                                         {0x2028, 0x202E},
                                         {0x2060, 0x206F},
                                         {0xFEFF, 0xFEFF},
                                         {0xFFF9, 0xFFFB},
                                         {0xFFFE, 0xFFFF},
                                         {0xE0000, 0xE0FFF}}};

bool IsSeen(char32_t character) {
  return std::none_of(kUnseen.begin(), kUnseen.end(), [&](const Range& range) {
    return character >= range.first && character <= range.last;
  });
}

bool IsContinuation(char byte) { return (static_cast<unsigned char>(byte) & 0xC0) == 0x80; }

struct Decoded {
  std::size_t size = 1;
  bool isVisible = false;
};

// What begins a sequence of `size` bytes, its bits of the character, and the least character that
// needs so many.
struct Lead {
  unsigned char mask;
  unsigned char pattern;
  std::size_t size;
  char32_t least;
};
constexpr std::array<Lead, 4> kLeads{
    {{0x80, 0x00, 1, 0}, {0xE0, 0xC0, 2, 0x80}, {0xF0, 0xE0, 3, 0x800}, {0xF8, 0xF0, 4, 0x10000}}};

// The character that `text` begins with; one byte when it begins with none.
Decoded Decode(std::string_view text) {
  const auto byte = static_cast<unsigned char>(text.front());
  for (const Lead& lead : kLeads) {
    if ((byte & lead.mask) != lead.pattern) continue;
    if (text.size() < lead.size) return {};
    char32_t character = byte & static_cast<unsigned char>(~lead.mask);
    for (std::size_t i = 1; i < lead.size; ++i) {
      if (!IsContinuation(text[i])) return {};
      character = character << 6 | (static_cast<unsigned char>(text[i]) & 0x3F);
    }
    const bool isSurrogate = character >= 0xD800 && character <= 0xDFFF;
    if (character < lead.least || character > 0x10FFFF || isSurrogate) return {};
    return {lead.size, IsSeen(character)};
  }
  return {};
}

std::string Escaped(std::string_view bytes) {
  constexpr char kHex[] = "0123456789abcdef";
  std::string escaped;
  for (const char c : bytes) {
    const auto byte = static_cast<unsigned char>(c);
    escaped += {'\\', 'x', kHex[byte >> 4], kHex[byte & 0xF]};
  }
  return escaped;
}

}  // namespace

std::string VisibleText(const std::string& text) {
  std::string visible;
  std::string_view rest = text;
  while (!rest.empty()) {
    const Decoded next = Decode(rest);
    const std::string_view bytes = rest.substr(0, next.size);
    visible += next.isVisible ? std::string(bytes) : Escaped(bytes);
    rest.remove_prefix(next.size);
  }
  return visible;
}

std::size_t CharactersIn(const std::string& text) {
  return text.size() -
         static_cast<std::size_t>(std::count_if(text.begin(), text.end(), IsContinuation));
}

std::string Shortened(const std::string& text, std::size_t most) {
  if (CharactersIn(text) <= most) return text;
  std::size_t end = 0;
  for (std::size_t characters = 0; characters < most; ++characters) {
    do {
      ++end;
    } while (IsContinuation(text[end]));
  }
  return text.substr(0, end) + "…";
}

}  // namespace SecPolicyTool
