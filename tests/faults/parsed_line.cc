// Which line of a policy file an operation belongs to.
#include "tests/faults/baseline.h"
#include "tests/faults/pattern.h"

namespace SecPolicyFaults {

namespace {

// How many operations it takes to parse a line that has no mistake.
std::size_t OperationsToParse(const PolicyLine& line) {
  struct Row {
    const char* keyword;
    std::size_t operations;
  };
  static constexpr Row kRows[] = {{"-s", 1}, {"-c", 1}, {"-p", 1}, {"-a", 2}, {"-u", 2},
                                  {"-f", 3}, {"-d", 3}, {"-r", 0}, {"-E", 1}};
  for (const Row& row : kRows) {
    if (line.words.front() == row.keyword) return row.operations;
  }
  return line.words.size() == 2 ? 1 : 0;  // a label for a path
}

}  // namespace

bool IsInParsing(const Baseline& baseline, std::size_t event) {
  const Phase phase = baseline.phases[event];
  const std::string name = WordOf(baseline.At(event), 0);
  const bool parses = phase == Phase::kDomainsParse || phase == Phase::kTardisksParse ||
                      phase == Phase::kLabelsParse;
  return parses && (name == "validate-word" || name == "find-domain");
}

ParsedLine LineParsedAt(const Baseline& baseline, std::size_t event) {
  const std::size_t opened = baseline.LastBefore(event, EventKind::kFile, "fopen ");
  const std::string file = WordOf(baseline.At(opened), 1);
  std::size_t operation = 0;
  for (std::size_t i = opened; i < event; ++i) operation += IsInParsing(baseline, i) ? 1 : 0;
  for (const PolicyLine& line : PolicyLinesOf(file)) {
    const std::size_t count = OperationsToParse(line);
    if (operation < count) return {file, line.number, line.offset};
    operation -= count;
  }
  return {file, 0, 0};
}

}  // namespace SecPolicyFaults
