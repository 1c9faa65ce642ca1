#include "tools/check/file_oddities.h"

#include <algorithm>

#include "tools/policy/counted.h"

namespace SecPolicyTool {

namespace {

void CheckLength(const CheckedFile& file, const PolicyLine& line, Findings& findings) {
  if (line.whole.size() <= kLongestLine) return;
  const std::size_t cut = line.whole.size() - kLongestLine;
  findings.AddWarning(Kind::kLongLine, SpotAt(file, line, kLongestLine + 1, cut),
                      "the line has " + std::to_string(line.whole.size()) +
                          " bytes, of which a load reads 1023; ignored are the last " +
                          Counted(cut, "byte") + " and " + Counted(file.text.hiddenLines, "line") +
                          " below",
                      "break the line up, or put its comment on lines of its own");
}

// A NUL in a comment hides nothing.
void CheckNul(const CheckedFile& file, const PolicyLine& line, Findings& findings) {
  const std::string read = line.whole.substr(0, std::min(kLongestLine, line.whole.find('#')));
  const std::size_t at = read.find('\0');
  if (at == std::string::npos) return;
  findings.AddWarning(Kind::kNulByte, SpotAt(file, line, at + 1, 1),
                      "a NUL byte ends the line; what follows it is ignored", "remove the byte");
}

void CheckByte(const CheckedFile& file, const PolicyLine& line, char byte, Kind kind,
               const char* message, const char* help, Findings& findings) {
  for (const LineWord& word : line.words) {
    const std::size_t at = word.text.find(byte);
    if (at == std::string::npos) continue;
    findings.AddWarning(kind, SpotAt(file, line, word.column + at, 1), message, help);
    return;
  }
}

}  // namespace

void CheckOddities(const CheckedFile& file, Findings& findings) {
  for (const PolicyLine& line : file.text.lines) {
    CheckLength(file, line, findings);
    CheckNul(file, line, findings);
    CheckByte(file, line, '\t', Kind::kTab, "a tab separates no words: it is part of the word",
              "use spaces", findings);
    CheckByte(file, line, '\r', Kind::kCarriageReturn, "a carriage return is part of the word",
              "save the file with line ends of a newline alone", findings);
  }
}

}  // namespace SecPolicyTool
