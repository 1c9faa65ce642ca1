// The corpus: policy files, each with what it has to come to, made without asking the library.
#pragma once

#include <string>
#include <vector>

namespace SecPolicyTest {

// Stand in expected texts for the number of the line that a case is about, and for the file's path.
inline constexpr char kLineMark = '\x01';
inline constexpr char kFileMark = '\x02';
inline const std::string kLine(1, kLineMark);
inline const std::string kFile(1, kFileMark);

// A line that a case is about.
struct CorpusLine {
  std::vector<std::string> words;
  std::string error;      // what its file is refused with; empty for a good line
  std::string record;     // what it leaves behind: a text, or several, each on a line
  bool endsFile = false;  // the lines behind it are not looked at
};

// Lines to put around it, with what they leave behind; empty for none.
struct Neighbours {
  std::string first, firstRecord;
  std::string last, lastRecord;
  bool always = false;  // in every file, not in some of them
};

// A file and what it has to come to.
struct CorpusCase {
  std::string text;
  std::string error;                 // empty for none
  std::vector<std::string> records;  // in byte order
};

// Each line as it may stand in a file: with other spaces, comments, NULs, lengths, neighbours,
// blank lines before it, and without an end. Of all these ways, each line gets every `step`-th, the
// next line the ones after those.
std::vector<CorpusCase> LayOut(const std::vector<CorpusLine>& lines, const Neighbours& neighbours,
                               std::size_t step = 1);

// ---- The lines, by kind ------------------------------------------------------------------------

// Of domain files: `keyword` is one of the seven types that end in a decision.
std::vector<CorpusLine> KeywordLines(const std::string& keyword);
std::vector<CorpusLine> PathLines();
std::vector<CorpusLine> LinesOfUnknownType();
// Whole files in which two lines contradict each other.
std::vector<CorpusCase> Contradictions();

std::vector<CorpusLine> ObjectLines();
// `held` is a file that can be labelled.
std::vector<CorpusLine> FileLabelLines(const std::string& held);
std::vector<CorpusLine> TardiskLines();
// Lines behind a good one, which is the only one that is allowed.
std::vector<CorpusLine> SecondTardiskLines();

}  // namespace SecPolicyTest
