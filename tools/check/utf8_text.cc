#include "tools/check/utf8_text.h"

#include <algorithm>

#include "tools/policy/terminal.h"

namespace SecPolicyTool {

namespace {

// What the first byte says, and the smallest code point that needs so many bytes.
struct Lead {
  std::size_t bytes;
  unsigned int bits;
  unsigned int smallest;
};

Lead LeadOf(unsigned char byte) {
  if (byte < 0x80) return {1, byte, 0};
  if (byte >> 5 == 0x6) return {2, byte & 0x1FU, 0x80};
  if (byte >> 4 == 0xE) return {3, byte & 0xFU, 0x800};
  if (byte >> 3 == 0x1E) return {4, byte & 0x7U, 0x10000};
  return {0, 0, 0};
}

}  // namespace

std::size_t CharacterBytes(std::string_view text) {
  const Lead lead = LeadOf(static_cast<unsigned char>(text.front()));
  if (lead.bytes == 0 || lead.bytes > text.size()) return 0;
  unsigned int point = lead.bits;
  for (std::size_t i = 1; i < lead.bytes; ++i) {
    const auto byte = static_cast<unsigned char>(text[i]);
    if (byte >> 6 != 0x2) return 0;
    point = point << 6 | (byte & 0x3FU);
  }
  const bool isSurrogate = point >= 0xD800 && point <= 0xDFFF;
  return point < lead.smallest || point > 0x10FFFF || isSurrogate ? 0 : lead.bytes;
}

std::size_t CharacterCount(std::string_view text) {
  std::size_t count = 0;
  for (; !text.empty(); ++count) {
    text.remove_prefix(std::max<std::size_t>(1, CharacterBytes(text)));
  }
  return count;
}

std::string ValidText(std::string_view text) {
  std::string valid;
  while (!text.empty()) {
    const std::size_t bytes = CharacterBytes(text);
    valid += bytes == 0 ? std::string_view("\xEF\xBF\xBD") : text.substr(0, bytes);
    text.remove_prefix(std::max<std::size_t>(1, bytes));
  }
  return valid;
}

namespace {

// C1 control characters, which are two bytes in UTF-8, mean something to some terminals.
bool IsControl(std::string_view character) {
  return character.size() == 2 && character[0] == '\xC2' &&
         static_cast<unsigned char>(character[1]) < 0xA0;
}

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

}  // namespace

std::string TerminalText(std::string_view text) {
  if (std::all_of(text.begin(), text.end(), IsPlain)) return std::string(text);
  std::string shown;
  while (!text.empty()) {
    const std::size_t bytes = CharacterBytes(text);
    const std::string_view part = text.substr(0, std::max<std::size_t>(1, bytes));
    shown += bytes == 0 || IsControl(part) ? Escaped(part) : Printable(std::string(part));
    text.remove_prefix(part.size());
  }
  return shown;
}

}  // namespace SecPolicyTool
