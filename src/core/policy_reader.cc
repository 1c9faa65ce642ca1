// The reader of policy files: lines to words, files to lines, directories to files.
#include <string_view>
#include <utility>

#include "core/directory_stream.h"
#include "core/file_access.h"
#include "core/line_reader.h"
#include "core/policy_lines.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;

namespace {

using Lines = std::map<unsigned int, std::queue<std::string>>;

bool HasWords(std::string_view text) {
  return text.find_first_not_of(' ') != std::string_view::npos;
}

void AppendWords(std::string_view text, std::queue<std::string>& words) {
  ForEachWord(text, [&](std::string_view word, std::size_t) { words.emplace(word); });
}

std::queue<std::string> SplitAtSpaces(std::string_view text) {
  std::queue<std::string> words;
  AppendWords(text, words);
  return words;
}

// Stores the words of a line that has any. A new entry, as a rule the last, is filled where it is:
// moving a queue takes as long as filling it.
void Store(unsigned int number, std::string_view text, Lines& lines) {
  const std::size_t before = lines.size();
  const auto entry = lines.try_emplace(lines.end(), number);
  if (lines.size() == before) {
    entry->second = SplitAtSpaces(text);
    return;
  }
  try {
    AppendWords(text, entry->second);
  } catch (...) {
    lines.erase(entry);
    throw;
  }
}

}  // namespace

std::queue<std::string> StringToQueue(std::string text) { return SplitAtSpaces(text); }

std::queue<std::string> ParsePolicyLine(std::string line) {
  return SplitAtSpaces(BeforeComment(line));
}

void ParseFile(std::string path, std::map<unsigned int, std::queue<std::string>>& lines) {
  LineReader file(path);
  if (!file.IsOpen()) throw TavonException("Unable to open policy file " + path);
  for (unsigned int number = 1; const auto line = file.Next(); ++number) {
    const std::string_view text = BeforeComment(*line);
    if (HasWords(text)) Store(number, text, lines);
  }
}

void GetFileList(std::string dir, std::map<std::string, std::string>& files) {
  DirectoryStream directory(OpenPolicyDirectory(dir));
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
