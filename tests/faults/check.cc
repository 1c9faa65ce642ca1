#include "tests/faults/check.h"

#include <algorithm>
#include <iterator>
#include <sstream>

namespace SecPolicyFaults {

namespace {

using Findings = std::vector<std::string>;

constexpr std::array kEndings{"returned",          "threw",       "threw for a retry",
                              "ran out of memory", "threw other", "ended its process"};

std::string Told(Ending ending, const std::string& text) {
  const std::string what = kEndings[static_cast<std::size_t>(ending)];
  return text.empty() ? what : what + ": " + text;
}

std::string Told(const DueLine& line) { return (line.error ? "error: " : "info: ") + line.pattern; }

std::vector<std::string> OperationsOf(const RunResult& run) {
  std::vector<std::string> operations;
  for (const Event& event : run.events) {
    if (event.kind == EventKind::kOperation) operations.push_back(event.text);
  }
  return operations;
}

std::vector<DueLine> LogOf(const RunResult& run) {
  std::vector<DueLine> log;
  for (const Event& event : run.events) {
    if (event.kind == EventKind::kInfo || event.kind == EventKind::kError) {
      log.push_back(LineOf(event));
    }
  }
  return log;
}

std::vector<std::string> LinesOf(const std::string& text) {
  std::istringstream stream(text);
  std::vector<std::string> lines;
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  return lines;
}

bool IsSubsequence(const std::vector<std::string>& some, const std::vector<std::string>& all) {
  auto at = all.begin();
  return std::all_of(some.begin(), some.end(), [&](const std::string& line) {
    at = std::find(at, all.end(), line);
    return at != all.end() && (++at, true);
  });
}

// Walks along what is due and what came.
class LogCheck {
 public:
  LogCheck(const Scenario& scenario, const Due& due)
      : isPlace_([&](const std::string& place) {
          return LineHas(place, scenario.policyDir, due.placeWords);
        }) {
    for (const DueLine& line : due.log) (line.floating ? floating_ : lines_).push_back(line);
  }

  void Compare(const std::vector<DueLine>& log, Findings& findings) {
    for (const DueLine& line : log) {
      if (!Accepts(line)) {
        findings.push_back("logged " + Told(line) + "\n      due: " +
                           (next_ < lines_.size() ? Told(lines_[next_]) : "nothing more"));
        return;
      }
    }
    if (next_ < lines_.size()) findings.push_back("not logged: " + Told(lines_[next_]));
    for (const DueLine& line : floating_) findings.push_back("not logged: " + Told(line));
  }

 private:
  bool Fits(const DueLine& due, const DueLine& line) const {
    return due.error == line.error && Matches(due.pattern, line.pattern, isPlace_);
  }

  bool Accepts(const DueLine& line) {
    if (next_ < lines_.size() && Fits(lines_[next_], line)) {
      ++next_;
      return true;
    }
    const auto found = std::find_if(floating_.begin(), floating_.end(),
                                    [&](const DueLine& due) { return Fits(due, line); });
    if (found == floating_.end()) return false;
    floating_.erase(found);
    return true;
  }

  PlaceCheck isPlace_;
  std::vector<DueLine> lines_;
  std::vector<DueLine> floating_;
  std::size_t next_ = 0;
};

void CompareOperations(const std::vector<DueOperation>& due,
                       const std::vector<std::string>& operations, Findings& findings) {
  std::size_t next = 0;
  for (const DueOperation& operation : due) {
    if (next < operations.size() && operations[next] == operation.text) {
      ++next;
    } else if (!operation.optional) {
      findings.push_back("operation due: " + operation.text +
                         "\n      came: " + (next < operations.size() ? operations[next] : "none"));
      return;
    }
  }
  if (next < operations.size()) findings.push_back("operation not due: " + operations[next]);
}

void CompareOutput(const Due& due, const RunResult& undisturbed, const RunResult& run,
                   Findings& findings) {
  bool right = run.out == undisturbed.out;
  if (due.out == Output::kBeginning) right = undisturbed.out.starts_with(run.out);
  if (due.out == Output::kSomeLines) {
    right = IsSubsequence(LinesOf(run.out), LinesOf(undisturbed.out));
  }
  if (!right) findings.push_back("what is printed is not what is due:\n" + run.out);
}

// Standard error shows the errors of the log, line by line.
void CompareErrors(const RunResult& run, Findings& findings) {
  std::string errors;
  for (const Event& event : run.events) {
    if (event.kind == EventKind::kError) errors += event.text + "\n";
  }
  if (run.err != errors) findings.push_back("standard error is not what is logged:\n" + run.err);
}

std::vector<std::string> SortedLines(const std::string& text) {
  std::vector<std::string> lines = LinesOf(text);
  for (std::string& line : lines) line.resize(line.find_last_not_of(",") + 1);
  std::sort(lines.begin(), lines.end());
  return lines;
}

void CompareStates(const RunResult& undisturbed, const RunResult& run, Findings& findings) {
  const std::vector<std::string> expected = SortedLines(undisturbed.state);
  const std::vector<std::string> held = SortedLines(run.state);
  const auto compare = [&](const auto& some, const auto& others, const char* what) {
    std::vector<std::string> difference;
    std::set_difference(some.begin(), some.end(), others.begin(), others.end(),
                        std::back_inserter(difference));
    for (const std::string& line : difference) findings.push_back(what + line);
  };
  compare(held, expected, "repeated, the kernel holds: ");
  compare(expected, held, "repeated, the kernel does not hold: ");
}

void CompareEnding(const RunResult& expected, const RunResult& run, Findings& findings) {
  if (run.ending != expected.ending || run.text != expected.text) {
    findings.push_back("run again, it " + Told(run.ending, run.text) + "\n      due: it " +
                       Told(expected.ending, expected.text));
  }
}

}  // namespace

Findings Differences(const Scenario& scenario, const RunResult& undisturbed, const Due& due,
                     const RunResult& run) {
  Findings findings = run.findings;
  const bool isText = due.ending == Ending::kThrew || due.ending == Ending::kRetry;
  const auto isPlace = [&](const std::string& place) {
    return LineHas(place, scenario.policyDir, due.placeWords);
  };
  if (run.ending != due.ending || (isText && !Matches(due.text, run.text, isPlace))) {
    findings.push_back("it " + Told(run.ending, run.text) + "\n      due: it " +
                       Told(due.ending, due.text));
  }
  LogCheck(scenario, due).Compare(LogOf(run), findings);
  CompareOperations(due.operations, OperationsOf(run), findings);
  CompareOutput(due, undisturbed, run, findings);
  CompareErrors(run, findings);
  return findings;
}

Findings DifferencesFromUndisturbed(const RunResult& undisturbed, const RunResult& run) {
  Findings findings = run.findings;
  CompareEnding(undisturbed, run, findings);
  const auto same = [](const Event& one, const Event& other) {
    return one.kind == other.kind && one.text == other.text;
  };
  if (!std::equal(run.events.begin(), run.events.end(), undisturbed.events.begin(),
                  undisturbed.events.end(), same)) {
    findings.emplace_back("run again, it does something else");
  }
  if (run.out != undisturbed.out || run.err != undisturbed.err) {
    findings.emplace_back("run again, it prints something else");
  }
  if (run.state != undisturbed.state) findings.emplace_back("run again, it leaves something else");
  return findings;
}

Findings DifferencesWhenRepeated(const RunResult& undisturbed, const RunResult& run) {
  Findings findings = run.findings;
  CompareEnding(undisturbed, run, findings);
  if (run.err != undisturbed.err) {
    findings.push_back("repeated, it logs something else:\n" + run.err);
  }
  CompareStates(undisturbed, run, findings);
  return findings;
}

}  // namespace SecPolicyFaults
