#include "tests/faults/pattern.h"

#include <algorithm>
#include <fstream>
#include <sstream>
#include <utility>

namespace SecPolicyFaults {

namespace {

constexpr char kAny[] = "{any}";
constexpr char kPlace[] = "{place}";

// The token that stands first in `pattern` from `start` on; npos when there is none.
std::size_t NextToken(const std::string& pattern, const char*& token) {
  const std::size_t any = pattern.find(kAny);
  const std::size_t place = pattern.find(kPlace);
  token = any < place ? kAny : kPlace;
  return std::min(any, place);
}

std::vector<std::string> WordsOfLine(const std::string& line) {
  std::istringstream text(line.substr(0, line.find('#')));
  std::vector<std::string> words;
  for (std::string word; text >> word;) words.push_back(word);
  return words;
}

}  // namespace

bool Matches(const std::string& pattern, const std::string& text, const PlaceCheck& isPlace) {
  const char* token = nullptr;
  const std::size_t at = NextToken(pattern, token);
  if (at == std::string::npos) return pattern == text;
  if (text.compare(0, at, pattern, 0, at) != 0) return false;
  const std::string rest = pattern.substr(at + std::string(token).size());
  for (std::size_t end = at; end <= text.size(); ++end) {
    const bool fits = token == kAny || isPlace(text.substr(at, end - at));
    if (fits && Matches(rest, text.substr(end), isPlace)) return true;
  }
  return false;
}

std::string Filled(std::string pattern, const std::string& token, const std::string& text) {
  const std::size_t at = pattern.find(token);
  return at == std::string::npos ? pattern : pattern.replace(at, token.size(), text);
}

bool LineHas(const std::string& place, const std::string& policyDir,
             const std::vector<std::string>& words) {
  const std::size_t colon = place.rfind(':');
  if (colon == std::string::npos) return false;
  const std::string name = place.substr(0, colon);
  const std::string digits =
      place.substr(std::min(place.find_first_not_of(' ', colon + 1), place.size()));
  if (digits.empty() || digits.find_first_not_of("0123456789") != std::string::npos) return false;
  const std::string file = name.starts_with("/") ? name : policyDir + "/domains/" + name;
  const auto number = static_cast<unsigned int>(std::stoul(digits));
  for (const PolicyLine& line : PolicyLinesOf(file)) {
    if (line.number != number) continue;
    return std::all_of(words.begin(), words.end(), [&](const std::string& word) {
      return std::find(line.words.begin(), line.words.end(), word) != line.words.end();
    });
  }
  return false;
}

std::vector<PolicyLine> PolicyLinesOf(const std::string& file) {
  std::ifstream stream(file);
  std::vector<PolicyLine> lines;
  std::size_t offset = 0;
  std::string text;
  for (unsigned int number = 1; std::getline(stream, text); ++number) {
    std::vector<std::string> words = WordsOfLine(text);
    if (!words.empty()) lines.push_back({number, std::move(words), offset});
    offset += text.size() + 1;
  }
  return lines;
}

}  // namespace SecPolicyFaults
