#include <algorithm>
#include <sstream>

#include "tests/corpus/corpus.h"

namespace SecPolicyTest {

namespace {

const std::string kNul(1, '\0');
const std::string kNeverRead = "-x this line is never read\n";

// How a line stands in its file. Pads count the characters of the whole line.
struct Layout {
  std::string before = "";
  std::string lead = "";
  std::string gap = " ";
  std::string tail = "\n";
  std::size_t padTo = 0;  // 0 for none
  char filler = ' ';
  bool padsInFront = false;
  std::string after = "";
  bool hasNeighbours = false;
};

std::string Lines(unsigned int count) { return std::string(count, '\n'); }

const std::vector<Layout>& Layouts() {
  static const std::vector<Layout> layouts{
      {},
      {.tail = ""},
      {.before = Lines(2)},
      {.before = "# a comment\n   \n#\n\n"},
      {.before = Lines(99)},
      {.before = kNul + "\n" + kNul + "-x\n"},
      {.before = std::string(1023, '#') + "\n"},
      {.before = std::string(1023, ' ') + "\n"},
      {.before = "#" + std::string(500, '-') + "\n\n"},
      {.lead = "   ", .gap = "   ", .tail = "   \n"},
      {.lead = " ", .gap = "  ", .tail = " "},
      {.tail = "#comment\n"},
      {.tail = "##\n"},
      {.tail = " # -x \t grant\n"},
      {.tail = " #"},
      {.tail = kNul + " more words\n"},
      {.tail = " " + kNul + "#"},
      {.tail = "\n\n# the end\n\n"},
      {.padTo = 1022, .filler = '#'},
      {.padTo = 1023, .filler = ' '},
      {.tail = "", .padTo = 1023, .filler = '#'},
      {.padTo = 1024, .filler = ' ', .after = kNeverRead},
      {.padTo = 1025, .filler = '#', .after = kNeverRead},
      {.padTo = 1023, .padsInFront = true},
      {.hasNeighbours = true},
      {.before = "\n#\n", .tail = "   # comment\n\n", .hasNeighbours = true},
      {.padTo = 1023, .filler = '#', .hasNeighbours = true},
      {.padTo = 1022, .padsInFront = true, .hasNeighbours = true},
  };
  return layouts;
}

std::string Joined(const std::vector<std::string>& words, const std::string& gap) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : gap) + word;
  return text;
}

// The line without its end.
std::string LineOf(const CorpusLine& line, const Layout& layout) {
  const std::string text = layout.lead + Joined(line.words, layout.gap);
  const std::size_t missing = layout.padTo > text.size() ? layout.padTo - text.size() : 0;
  const std::string pad(missing, layout.filler);
  return layout.padsInFront ? pad + text : text + pad;
}

unsigned int CountLines(const std::string& text) {
  return static_cast<unsigned int>(std::count(text.begin(), text.end(), '\n'));
}

// `text` with its line marks replaced by the number of the line behind `before`.
std::string WithLine(std::string text, const std::string& before) {
  const std::string number = std::to_string(CountLines(before) + 1);
  for (std::size_t at = 0; (at = text.find(kLineMark, at)) != std::string::npos;) {
    text.replace(at, 1, number);
  }
  return text;
}

// Adds the lines of `record`, whose own line is the one behind `before`.
void AddRecords(const std::string& record, const std::string& before, CorpusCase& laid) {
  std::istringstream stream(WithLine(record, before));
  for (std::string one; std::getline(stream, one);) laid.records.push_back(one);
}

CorpusCase LaidOut(const CorpusLine& line, const Layout& layout, const Neighbours& neighbours) {
  CorpusCase laid;
  const bool hasNeighbours = layout.hasNeighbours || neighbours.always;
  if (hasNeighbours && !neighbours.first.empty()) {
    laid.text = neighbours.first + "\n";
    AddRecords(neighbours.firstRecord, "", laid);
  }
  laid.text += layout.before;
  laid.error = WithLine(line.error, laid.text);
  AddRecords(line.record, laid.text, laid);
  laid.text += LineOf(line, layout) + layout.tail + layout.after;
  if (hasNeighbours && !neighbours.last.empty()) {
    if (!line.endsFile) AddRecords(neighbours.lastRecord, laid.text, laid);
    laid.text += neighbours.last;
  }
  std::sort(laid.records.begin(), laid.records.end());
  return laid;
}

}  // namespace

std::vector<CorpusCase> LayOut(const std::vector<CorpusLine>& lines, const Neighbours& neighbours,
                               std::size_t step) {
  std::vector<CorpusCase> cases;
  for (std::size_t line = 0; line < lines.size(); ++line) {
    for (std::size_t i = line % step; i < Layouts().size(); i += step) {
      const Layout& layout = Layouts()[i];
      // A line alone is in the other layouts already.
      if (layout.hasNeighbours && neighbours.first.empty()) continue;
      cases.push_back(LaidOut(lines[line], layout, neighbours));
    }
  }
  return cases;
}

}  // namespace SecPolicyTest
