#include "host/image/quoted_name.h"

namespace StandIn {

namespace {

constexpr std::size_t kMaxShownBytes = 255;
constexpr char kHexDigits[] = "0123456789abcdef";

bool IsShownAsItIs(unsigned char byte) {
  return byte >= 0x20 && byte != 0x7f && byte != '"' && byte != '\\';
}

}  // namespace

std::string QuotedName(const std::string& name) {
  std::string shown = "\"";
  for (const char character : name.substr(0, kMaxShownBytes)) {
    const auto byte = static_cast<unsigned char>(character);
    if (IsShownAsItIs(byte)) {
      shown += character;
    } else {
      shown += {'\\', 'x', kHexDigits[byte >> 4], kHexDigits[byte & 15]};
    }
  }
  return shown + (name.size() > kMaxShownBytes ? "...\"" : "\"");
}

}  // namespace StandIn
