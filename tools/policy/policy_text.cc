#include "tools/policy/policy_text.h"

#include <algorithm>
#include <stdexcept>
#include <utility>

#include "host/files/file_io.h"
#include "secpolicy/host/host_error.h"

namespace SecPolicyTool {

namespace {

// The lines of `text`, of which the last may lack its end.
std::size_t CountLines(std::string_view text) {
  const auto ends = static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n'));
  return ends + (text.empty() || text.ends_with('\n') ? 0 : 1);
}

}  // namespace

std::vector<LineWord> WordsOf(std::string_view line) {
  std::vector<LineWord> words;
  SecPolicy::ForEachWord(
      SecPolicy::BeforeComment(line), [&](std::string_view word, std::size_t position) {
        words.push_back({std::string(word), static_cast<unsigned int>(position + 1)});
      });
  return words;
}

PolicyText ReadPolicyText(std::string_view content) {
  PolicyText text;
  std::string_view unread = content;
  while (const auto line = SecPolicy::TakeLine(unread, true)) {
    const auto number = static_cast<unsigned int>(text.lines.size() + 1);
    std::string whole(line->bytes);
    if (line->endsFile) {
      const std::size_t cut = std::min(unread.find('\n'), unread.size());
      whole += unread.substr(0, cut);
      unread.remove_prefix(std::min(cut + 1, unread.size()));
      text.hiddenLines = CountLines(unread);
      unread = {};
    }
    text.lines.push_back({number, std::move(whole), WordsOf(line->text)});
  }
  return text;
}

PolicyText ReadPolicyFile(const StandIn::FileTree& tree, const std::string& path) {
  const StandIn::UniqueFd file = tree.Open(path, O_RDONLY);
  if (!file.IsOpen()) throw std::runtime_error("Unable to open policy file " + path);
  std::string content;
  try {
    content = StandIn::ReadAll(file.Get(), path);
  } catch (const StandIn::HostError&) {
    // A load takes what precedes a read error for the whole file; of a directory that is nothing.
  }
  return ReadPolicyText(content);
}

std::vector<PolicyLine> PolicyLines(const StandIn::FileTree& tree, const std::string& path) try {
  return ReadPolicyFile(tree, path).lines;
} catch (const std::runtime_error&) {
  return {};
}

Place PlaceOf(const SharedName& file, const PolicyLine& line) {
  return {file, line.number, line.words.empty() ? 0 : line.words.front().column};
}

}  // namespace SecPolicyTool
