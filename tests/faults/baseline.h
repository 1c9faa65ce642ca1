// The undisturbed run of a scenario, and where in it things can fail.
#pragma once

#include <map>
#include <string>
#include <vector>

#include "tests/faults/run.h"

namespace SecPolicyFaults {

struct Baseline {
  explicit Baseline(RunResult run, Phase first);

  RunResult run;
  std::vector<Phase> phases;       // by event
  std::vector<std::size_t> items;  // by event: what an item of a phase is, has a number
  std::vector<std::size_t> calls;  // by event: the trapped call in which it happened, or kNowhere

  static constexpr std::size_t kNowhere = static_cast<std::size_t>(-1);

  [[nodiscard]] const Event& At(std::size_t event) const { return run.events[event]; }

  // The event that the fault befalls. An allocation outside of trapped calls befalls none.
  [[nodiscard]] std::size_t EventOf(const Fault& fault) const;

  // The last event before `event` of this kind whose text starts so; kNowhere when there is none.
  [[nodiscard]] std::size_t LastBefore(std::size_t event, EventKind kind,
                                       const std::string& start) const;
  [[nodiscard]] std::size_t FirstFrom(std::size_t event, EventKind kind,
                                      const std::string& start) const;
};

// The line of a policy file that was being parsed at an event of a phase that parses; the file
// itself is the one opened before.
struct ParsedLine {
  std::string file;
  unsigned int number = 0;
  std::size_t offset = 0;  // where the line begins
};
ParsedLine LineParsedAt(const Baseline& baseline, std::size_t event);
// Whether the event is an operation, not a call for a file, of a phase that parses.
bool IsInParsing(const Baseline& baseline, std::size_t event);

// The door at which an event was counted; nothing for events that no fault befalls.
std::optional<Door> DoorOf(const Event& event);

// The words of an event, without the first `skipped` ones.
std::vector<std::string> WordsOf(const Event& event, std::size_t skipped);
std::string WordOf(const Event& event, std::size_t index);

}  // namespace SecPolicyFaults
