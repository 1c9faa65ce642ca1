#include "core/line_reader.h"

#include <algorithm>
#include <ios>

namespace SecPolicy {

namespace {

std::string_view BeforeNul(std::string_view line) { return line.substr(0, line.find('\0')); }

}  // namespace

std::optional<std::string_view> LineReader::Next() {
  // Of the longest line the end has to be seen as well.
  constexpr std::size_t kSeen = kLongestLine + 1;
  do {
    const std::size_t end = unread_.substr(0, kSeen).find('\n');
    if (end != std::string_view::npos) return Take(end, end + 1);
  } while (unread_.size() < kSeen && Refill());
  if (unread_.empty()) return std::nullopt;
  isAtEnd_ = true;
  return Take(std::min(unread_.size(), kLongestLine), unread_.size());
}

std::string_view LineReader::Take(std::size_t size, std::size_t skipped) {
  const std::string_view line = unread_.substr(0, size);
  unread_.remove_prefix(skipped);
  return BeforeNul(line);
}

bool LineReader::Refill() {
  if (isAtEnd_) return false;
  const std::size_t kept = unread_.size();
  std::copy(unread_.begin(), unread_.end(), block_.begin());
  const std::size_t added = ReadBehind(kept);
  unread_ = {block_.data(), kept + added};
  isAtEnd_ = added == 0;
  return !isAtEnd_;
}

// Takes what one reading of the file has brought: an error later on does not lose it.
std::size_t LineReader::ReadBehind(std::size_t kept) try {
  if (file_.sgetc() == std::filebuf::traits_type::eof()) return 0;
  const auto room = static_cast<std::streamsize>(block_.size() - kept);
  return static_cast<std::size_t>(
      file_.sgetn(block_.data() + kept, std::min(file_.in_avail(), room)));
} catch (const std::ios_base::failure&) {
  return 0;
}

}  // namespace SecPolicy
