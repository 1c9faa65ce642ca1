#include "host/text/quoted_name.h"

#include <algorithm>
#include <string_view>

#include "host/text/escaped.h"

namespace StandIn {

namespace {

constexpr std::size_t kMaxShownBytes = 255;

}  // namespace

std::string QuotedName(const std::string& name) {
  std::string shown = "\"";
  std::string_view rest = std::string_view(name).substr(0, kMaxShownBytes);
  while (!rest.empty()) {
    const std::size_t plain = std::min(rest.find_first_of("\"\\"), rest.size());
    shown += Escaped(rest.substr(0, plain)).Text();
    if (plain < rest.size()) AppendEscaped(shown, rest[plain]);
    rest.remove_prefix(std::min(plain + 1, rest.size()));
  }
  return shown + (name.size() > kMaxShownBytes ? "...\"" : "\"");
}

}  // namespace StandIn
