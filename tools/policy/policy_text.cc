#include "tools/policy/policy_text.h"

#include <algorithm>
#include <stdexcept>

#include "host/files/file_io.h"
#include "secpolicy/host/host_error.h"

namespace SecPolicyTool {

namespace {

PolicyLine LineOf(std::string_view whole, unsigned int number) {
  const std::string_view taken = whole.substr(0, kLongestLine);
  return {number, std::string(whole), WordsOf(taken.substr(0, taken.find('\0')))};
}

}  // namespace

std::vector<LineWord> WordsOf(std::string_view line) {
  line = line.substr(0, line.find('#'));
  std::vector<LineWord> words;
  for (std::size_t start = 0; start < line.size();) {
    const std::size_t end = std::min(line.find(' ', start), line.size());
    if (end != start) {
      words.push_back(
          {std::string(line.substr(start, end - start)), static_cast<unsigned int>(start + 1)});
    }
    start = end + 1;
  }
  return words;
}

PolicyText ReadPolicyText(std::string_view content) {
  PolicyText text;
  bool isHidden = false;
  for (std::size_t start = 0; start < content.size();) {
    const std::size_t end = std::min(content.find('\n', start), content.size());
    const std::string_view whole = content.substr(start, end - start);
    start = end + 1;
    if (isHidden) {
      ++text.hiddenLines;
      continue;
    }
    text.lines.push_back(LineOf(whole, static_cast<unsigned int>(text.lines.size() + 1)));
    isHidden = whole.size() > kLongestLine;
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

Place PlaceOf(const std::string& file, const PolicyLine& line) {
  return {file, line.number, line.words.empty() ? 0 : line.words.front().column};
}

}  // namespace SecPolicyTool
