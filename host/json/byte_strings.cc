#include <string_view>

#include "host/json/json_cursor.h"

namespace StandIn {

namespace {

constexpr std::string_view kHexDigits = "0123456789ABCDEF";

// The value of a hexadecimal digit of either case, -1 for anything else.
int HexValue(char digit) {
  const char upper = digit >= 'a' && digit <= 'f' ? static_cast<char>(digit - 'a' + 'A') : digit;
  const std::size_t value = kHexDigits.find(upper);
  return value == std::string_view::npos ? -1 : static_cast<int>(value);
}

}  // namespace

std::string EncodeBytes(const std::string& bytes) {
  std::string encoded;
  encoded.reserve(bytes.size());
  for (const char c : bytes) {
    const auto byte = static_cast<unsigned char>(c);
    if (byte < 0x80 && c != '%') {
      encoded += c;
    } else {
      encoded += '%';
      encoded += kHexDigits[byte >> 4];
      encoded += kHexDigits[byte & 0xF];
    }
  }
  return encoded;
}

std::string DecodeBytes(const JsonCursor& place) {
  const std::string encoded = place.String();
  std::string bytes;
  bytes.reserve(encoded.size());
  for (std::size_t i = 0; i < encoded.size(); ++i) {
    if (encoded[i] != '%') {
      bytes += encoded[i];
      continue;
    }
    const int high = i + 2 < encoded.size() ? HexValue(encoded[i + 1]) : -1;
    const int low = i + 2 < encoded.size() ? HexValue(encoded[i + 2]) : -1;
    if (high < 0 || low < 0) {
      place.Fail("holds \"%\" without two hexadecimal digits behind it");
    }
    bytes += static_cast<char>(high * 16 + low);
    i += 2;
  }
  return bytes;
}

}  // namespace StandIn
