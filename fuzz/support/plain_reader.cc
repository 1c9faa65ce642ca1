#include "fuzz/support/plain_reader.h"

namespace Fuzz {

namespace {

constexpr std::size_t kLongestLine = 1023;

void KeepLine(unsigned int number, const std::string& line, PlainLines& lines) {
  std::string beforeNul;
  for (const char c : line) {
    if (c == '\0') break;
    beforeNul += c;
  }
  const PlainWords words = PlainWordsOf(beforeNul);
  if (!words.empty()) lines[number] = words;
}

}  // namespace

PlainWords PlainWordsOf(const std::string& line) {
  PlainWords words;
  std::string word;
  for (const char c : line) {
    if (c == '#') break;
    if (c != ' ') {
      word += c;
    } else if (!word.empty()) {
      words.push_back(word);
      word.clear();
    }
  }
  if (!word.empty()) words.push_back(word);
  return words;
}

PlainLines PlainLinesOf(const std::string& bytes) {
  PlainLines lines;
  unsigned int number = 1;
  std::string line;
  for (const char c : bytes) {
    if (c == '\n') {
      KeepLine(number, line, lines);
      ++number;
      line.clear();
    } else if (line.size() == kLongestLine) {
      KeepLine(number, line, lines);
      return lines;
    } else {
      line += c;
    }
  }
  KeepLine(number, line, lines);
  return lines;
}

std::string Joined(const PlainWords& words, const std::string& between) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : between) + word;
  return text;
}

}  // namespace Fuzz
