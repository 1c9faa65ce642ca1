#include "core/line_reader.h"

#include <algorithm>
#include <ios>

namespace SecPolicy {

std::optional<std::string_view> LineReader::Next() {
  std::optional<TakenLine> line;
  while (!(line = TakeLine(unread_, isAtEnd_)) && !isAtEnd_) Refill();
  if (!line) return std::nullopt;
  if (line->endsFile) {
    unread_ = {};
    isAtEnd_ = true;
  }
  return line->text;
}

void LineReader::Refill() {
  const std::size_t kept = unread_.size();
  std::copy(unread_.begin(), unread_.end(), block_.begin());
  const std::size_t added = ReadBehind(kept);
  unread_ = {block_.data(), kept + added};
  isAtEnd_ = added == 0;
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
