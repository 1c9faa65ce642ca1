#include "host/text/utf8_text.h"

#include <algorithm>

namespace StandIn {

namespace {

// What the first byte says, and the smallest code point that needs so many bytes.
struct Lead {
  std::size_t bytes;
  char32_t bits;
  char32_t smallest;
};

Lead LeadOf(unsigned char byte) {
  if (byte < 0x80) return {1, byte, 0};
  if (byte >> 5 == 0x6) return {2, byte & 0x1FU, 0x80};
  if (byte >> 4 == 0xE) return {3, byte & 0xFU, 0x800};
  if (byte >> 3 == 0x1E) return {4, byte & 0x7U, 0x10000};
  return {0, 0, 0};
}

}  // namespace

Character FirstCharacter(std::string_view text) {
  const Lead lead = LeadOf(static_cast<unsigned char>(text.front()));
  if (lead.bytes == 0 || lead.bytes > text.size()) return {};
  char32_t point = lead.bits;
  for (std::size_t i = 1; i < lead.bytes; ++i) {
    const auto byte = static_cast<unsigned char>(text[i]);
    if (byte >> 6 != 0x2) return {};
    point = point << 6 | (byte & 0x3FU);
  }
  const bool isSurrogate = point >= 0xD800 && point <= 0xDFFF;
  if (point < lead.smallest || point > 0x10FFFF || isSurrogate) return {};
  return {lead.bytes, point};
}

std::size_t CharacterBytes(std::string_view text) { return FirstCharacter(text).bytes; }

std::size_t CharacterCount(std::string_view text) {
  std::size_t count = 0;
  for (; !text.empty(); ++count) {
    text.remove_prefix(std::max<std::size_t>(1, CharacterBytes(text)));
  }
  return count;
}

std::string Shortened(const std::string& text, std::size_t most) {
  std::size_t end = 0;
  for (std::size_t characters = 0; end < text.size(); ++characters) {
    if (characters == most) return text.substr(0, end) + "…";
    end += std::max<std::size_t>(1, CharacterBytes(std::string_view(text).substr(end)));
  }
  return text;
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

}  // namespace StandIn
