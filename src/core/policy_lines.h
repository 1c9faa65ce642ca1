// The grammar of policy files: text to lines, lines to words. Values only; no file is read here.
#pragma once

#include <algorithm>
#include <cstddef>
#include <optional>
#include <string_view>

namespace SecPolicy {

// A longer line ends its file: callers rely on that bound.
inline constexpr std::size_t kLongestLine = 1023;

struct TakenLine {
  std::string_view text;   // without its end, up to its first NUL byte, at most kLongestLine bytes
  std::string_view bytes;  // all that was taken from the text but the line's end
  bool endsFile = false;   // the end of the text, or a line that is too long: nothing follows
};

// Removes the first line from `unread`; the line's text points into it. After a line that is too
// long `unread` keeps what the line hides, and must not be taken from again. Nothing when `unread`
// is empty, or when the line's end is to be seen in text that is still to come: `isRest` tells that
// there is none.
[[nodiscard]] inline std::optional<TakenLine> TakeLine(std::string_view& unread, bool isRest) {
  // Of the longest line the end has to be seen as well.
  constexpr std::size_t kSeen = kLongestLine + 1;
  const std::size_t end = unread.substr(0, kSeen).find('\n');
  const bool hasEnd = end != std::string_view::npos;
  if (!hasEnd && unread.size() < kSeen && (!isRest || unread.empty())) return std::nullopt;
  const std::size_t length = hasEnd ? end : std::min(unread.size(), kLongestLine);
  const std::string_view line = unread.substr(0, length);
  unread.remove_prefix(hasEnd ? end + 1 : length);
  return TakenLine{line.substr(0, line.find('\0')), line, !hasEnd};
}

// The part of a line before its comment.
[[nodiscard]] inline std::string_view BeforeComment(std::string_view line) {
  return line.substr(0, line.find('#'));
}

// Hands `take` each word of `text` and the position of its first byte, from 0. Words are separated
// by spaces alone.
template <typename Take>
void ForEachWord(std::string_view text, const Take& take) {
  for (std::size_t start = 0; start < text.size();) {
    const std::size_t end = std::min(text.find(' ', start), text.size());
    if (end != start) take(text.substr(start, end - start), start);
    start = end + 1;
  }
}

}  // namespace SecPolicy
