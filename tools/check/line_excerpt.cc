#include "tools/check/line_excerpt.h"

#include <algorithm>
#include <string_view>

#include "host/text/utf8_text.h"

namespace SecPolicyTool {

using StandIn::CharacterCount;

namespace {

// Bytes that are shown around the mark's begin.
constexpr std::size_t kBefore = 60;
constexpr std::size_t kShown = 120;
constexpr char kCut[] = "...";

// Moves back to the begin of a character, which has at most four bytes.
std::size_t CharacterBegin(std::string_view line, std::size_t at) {
  const std::size_t least = at < 3 ? 0 : at - 3;
  while (at > least && at < line.size() && static_cast<unsigned char>(line[at]) >> 6 == 0x2) --at;
  return at;
}

}  // namespace

LineExcerpt ExcerptOf(const std::string& line, unsigned int column, unsigned int length) {
  const std::string_view whole = line;
  const std::size_t at = std::min<std::size_t>(column == 0 ? 0 : column - 1, whole.size());
  const bool isLong = whole.size() > kShown;
  const std::size_t begin = isLong && at > kBefore ? CharacterBegin(whole, at - kBefore) : 0;
  const std::size_t end =
      isLong ? CharacterBegin(whole, std::min(begin + kShown, whole.size())) : whole.size();
  const std::size_t stop = std::clamp<std::size_t>(at + std::max(1U, length), at, end);
  const TerminalText before =
      (begin > 0 ? kCut : "") + TerminalText(whole.substr(begin, at - begin));
  const TerminalText meant = whole.substr(at, stop - at);
  const TerminalText behind = whole.substr(stop, end - stop);
  const std::size_t width = std::max<std::size_t>(1, CharacterCount(meant.Text()));
  return {before + meant + behind + (end < whole.size() ? kCut : ""),
          std::string(CharacterCount(before.Text()), ' ') + "^" + std::string(width - 1, '~')};
}

}  // namespace SecPolicyTool
