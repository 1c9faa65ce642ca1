// Lines of object files and of file label files.
#include "tests/corpus/corpus.h"
#include "tests/corpus/line_parts.h"
#include "tests/corpus/word_table.h"

namespace SecPolicyTest {

namespace {

// Words of all shapes that hold no space, comment or NUL.
Words OddWords() {
  Words words{
      "a",    "A-b.c_d",         "\t",       "a\tb", "a\r", "\r", "\"quoted\"", "*",   "/*", "/",
      "-s",   "grant",           "\xc3\xa4", "\xff", "a\\", "'",  "$HOME",      "a,b", "0",  "-1",
      "\x7f", "\xef\xbb\xbfname"};
  for (std::size_t length = 2; length <= 127; length += 5) words.emplace_back(length, 'n');
  return words;
}

}  // namespace

std::vector<CorpusLine> ObjectLines() {
  std::vector<CorpusLine> lines;
  for (const std::string& name : OddWords()) lines.push_back({{name}, "", name});
  for (std::size_t count = 2; count <= 9; ++count) {
    for (const std::string& word : OddWords()) {
      // Words that are too long for a line would not all be seen.
      if (word.size() > 60) continue;
      lines.push_back(
          BadLine(Words(count, word), kAtLine + "cannot define more than one object per line"));
    }
  }
  return lines;
}

std::vector<CorpusLine> FileLabelLines(const std::string& held) {
  std::vector<CorpusLine> lines;
  const WordTable& objects = TableOf("object label");
  const auto failure = [](const std::string& label, const std::string& path) {
    return kAtLine + "Unable to set file label (" + label + ") for file " + path +
           ": No such file or directory";
  };
  for (const std::string& label : objects.words) {
    lines.push_back({{held, label}, "", "held|" + label});
    lines.push_back({{held + "/*", label},
                     "",
                     "held|" + label + "\n" + kAtLine + "Unable to open directory " + held});
    lines.push_back({{"/*", label}, "", failure(label, "")});
    for (const std::string path : {"/absent", "/absent/ab", "/absent*", "/absent\t", "absent/x",
                                   "/absent/x*y", "/absent\r", "*", "/absent**"}) {
      lines.push_back({{path, label}, "", failure(label, path)});
      lines.push_back({{path + "/*", label}, "", failure(label, path)});
    }
    for (const std::string path : {"/opt/*/bin", "/*/", "/*x", "/opt/*.conf", "/a/*/*", "/*/*",
                                   "/a/**", "/a/*\t", "/*\r", "//**", "a/*/b"}) {
      lines.push_back(
          BadLine({path, label}, kAtLine + "Unrecognized format for file/dir specification"));
    }
    for (const std::string& bad : Misspelt(objects, label)) {
      // The label is judged before the path, and reported without the line.
      for (const std::string path : {"/absent", "/opt/*/bin", "/*"}) {
        lines.push_back(BadLine({path, bad}, UnknownWord(objects, bad)));
      }
    }
  }
  for (const std::size_t count : {1U, 3U, 4U, 5U, 8U}) {
    for (const std::string word : {"/absent", "logs", "/opt/*/bin", "nothing", "grant"}) {
      lines.push_back(BadLine(Words(count, word), kAtLine + "incorrect no of parameters"));
    }
  }
  return lines;
}

}  // namespace SecPolicyTest
