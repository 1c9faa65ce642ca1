#include "tests/faults/load_places.h"

#include <algorithm>

namespace SecPolicyFaults {

namespace {

std::string BaseName(const std::string& path) { return path.substr(path.rfind('/') + 1); }

}  // namespace

std::string LabelledPath(const Baseline& baseline, std::size_t event) {
  const bool before = baseline.At(event).text.starts_with("lookup-label ");
  const std::size_t call = before ? baseline.FirstFrom(event, EventKind::kCall, "setxattr ")
                                  : baseline.LastBefore(event + 1, EventKind::kCall, "setxattr ");
  const bool isKnown = call != Baseline::kNowhere && baseline.items[call] == baseline.items[event];
  return isKnown ? WordOf(baseline.At(call), 1) : "{any}";
}

std::string ItemAt(const Baseline& baseline, std::size_t event) {
  const Phase phase = baseline.phases[event];
  if (phase == Phase::kDomainsCheck) {
    const std::string word = WordOf(baseline.At(event), 1);
    return word.substr(0, word.find(';'));
  }
  if (phase == Phase::kDomainsSet) {
    for (const char* name : {"set-rule ", "add-file-rules "}) {
      for (const std::size_t other : {baseline.FirstFrom(event, EventKind::kOperation, name),
                                      baseline.LastBefore(event, EventKind::kOperation, name)}) {
        if (other != Baseline::kNowhere && baseline.items[other] == baseline.items[event]) {
          return WordOf(baseline.At(other), 1);
        }
      }
    }
    return "";
  }
  const char* const door = phase == Phase::kTardisksParse ? "open " : "fopen ";
  const std::size_t opened = baseline.LastBefore(event + 1, EventKind::kFile, door);
  if (opened == Baseline::kNowhere) return "";
  const std::string path = WordOf(baseline.At(opened), 1);
  return phase == Phase::kDomainsParse ? BaseName(path) : path;
}

std::vector<std::string> PlaceWordsAt(const Baseline& baseline, std::size_t event) {
  const Event& failed = baseline.At(event);
  const Phase phase = baseline.phases[event];
  if (phase == Phase::kTardisksSet || phase == Phase::kLabelsSet) {
    const std::size_t label =
        baseline.LastBefore(event + 1, EventKind::kOperation, "lookup-label ");
    return {WordOf(baseline.At(label), 2)};
  }
  if (phase == Phase::kDomainsSet && failed.kind == EventKind::kCall) {
    const std::size_t path = baseline.LastBefore(event + 1, EventKind::kCall, "prctl ");
    return {"-r", WordOf(baseline.At(path), 1)};
  }
  if (failed.text.starts_with("find-domain ")) return WordsOf(failed, 1);
  std::vector<std::string> words = WordsOf(failed, 2);
  words.erase(std::find(words.begin(), words.end(), "#"), words.end());
  return words;
}

std::string LineNumberOf(const Event& event) {
  const std::size_t at = event.text.find(" line ");
  return at == std::string::npos ? "" : WordOf({event.kind, 0, event.text.substr(at)}, 1);
}

}  // namespace SecPolicyFaults
