// The reader of policy files: lines to words, files to lines, directories to files.
#include <algorithm>
#include <array>
#include <fstream>
#include <string_view>
#include <utility>

#include "core/directory_stream.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;

namespace {

// A line with its terminating NUL. A longer one ends the file: callers rely on that bound.
constexpr std::size_t kLineBytes = 1024;

std::queue<std::string> SplitAtSpaces(std::string_view text) {
  std::queue<std::string> words;
  while (!text.empty()) {
    const std::string_view word = text.substr(0, text.find(' '));
    if (!word.empty()) words.emplace(word);
    text.remove_prefix(std::min(word.size() + 1, text.size()));
  }
  return words;
}

std::queue<std::string> WordsBeforeComment(std::string_view line) {
  return SplitAtSpaces(line.substr(0, line.find('#')));
}

}  // namespace

std::queue<std::string> StringToQueue(std::string text) { return SplitAtSpaces(text); }

std::queue<std::string> ParsePolicyLine(std::string line) { return WordsBeforeComment(line); }

void ParseFile(std::string path, std::map<unsigned int, std::queue<std::string>>& lines) {
  std::ifstream file(path);
  if (!file) throw TavonException("Unable to open policy file " + path);
  std::array<char, kLineBytes> buffer{};
  for (unsigned int number = 1; file.good(); ++number) {
    file.getline(buffer.data(), buffer.size());
    std::queue<std::string> words = WordsBeforeComment(buffer.data());
    if (!words.empty()) lines.insert_or_assign(number, std::move(words));
  }
}

void GetFileList(std::string dir, std::map<std::string, std::string>& files) {
  DirectoryStream directory(dir);
  if (!directory.IsOpen()) throw TavonException("Unable to open policy directory " + dir);
  while (auto entry = directory.Next()) {
    if (entry->type == DT_REG) files[dir + "/" + entry->name] = entry->name;
  }
}

bool IsGrant(std::string& word) {
  if (word == "grant") return true;
  if (word == "revoke") return false;
  throw TavonException("invalid keyword " + word);
}

}  // namespace SecPolicy
