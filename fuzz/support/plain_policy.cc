#include "fuzz/support/plain_policy.h"

#include <algorithm>
#include <map>
#include <utility>

#include "fuzz/support/require.h"
#include "fuzz/support/small_world.h"

namespace Fuzz {

namespace {

// A list of words and what messages call one of them.
struct PlainList {
  std::string title;
  std::vector<std::string> words;
};

const PlainList kObject{"object label", kSmallObjects};
const PlainList kAnyWord{"", {}};

// By rule type: what judges each word in front of the decision. A target domain is judged by none,
// and before all others.
const std::map<std::string, std::vector<PlainList>> kTypes{
    {"-s", {{"system call", {"read", "openat", "close"}}}},
    {"-c", {{"capability", {"kill", "chown"}}}},
    {"-p", {{"capability with parameter", {"net_bind"}}, kAnyWord}},
    {"-a", {kObject, {"object access", {"read", "write"}}}},
    {"-d", {kObject, kAnyWord, {"transition event", {"exec"}}}},
    {"-f", {kObject, kObject, {"file type", {"file", "dir"}}}},
    {"-u", {kObject, {"socket type", {"stream"}}}},
};

bool Contains(const std::vector<std::string>& words, const std::string& word) {
  return std::find(words.begin(), words.end(), word) != words.end();
}

// What is wrong with a line; `isWhole` as in PlainOutcome.
struct Fault {
  std::string text;
  bool isWhole = true;
};

const char* const kWrongCount = "incorrect number of arguments for this rule type";

Fault FaultOfWords(const std::vector<PlainList>& lists, const PlainWords& words) {
  for (std::size_t i = 0; i < lists.size(); ++i) {
    if (!lists[i].title.empty() && !Contains(lists[i].words, words[i + 1])) {
      return {"unknown " + lists[i].title + " \"" + words[i + 1] + "\"", false};
    }
  }
  return {};
}

Fault FaultOfRule(const PlainWords& words) {
  const std::string& type = words[0];
  if (type == "-r") {
    return {words.size() == 2 || words.size() == 3 ? "" : kWrongCount};
  }
  const auto lists = kTypes.find(type);
  if (lists == kTypes.end()) return {"invalid policy rule type (" + type + ")"};
  if (words.size() != lists->second.size() + 2) return {kWrongCount};
  if (type == "-d" && !Contains(kSmallDomains, words[2])) {
    return {"Failed to fetch domain id for: " + words[2]};
  }
  const std::string& decision = words.back();
  if (decision != "grant" && decision != "revoke") return {"invalid keyword " + decision};
  return FaultOfWords(lists->second, words);
}

// Takes lines up to the first one that `faultOf` finds fault with; `before` stands between the
// line's number and the fault.
template <typename FaultOf>
PlainOutcome ReadUpToFault(const PlainLines& lines, const std::string& start,
                           const std::string& before, const FaultOf& faultOf) {
  PlainOutcome outcome;
  for (const auto& [number, words] : lines) {
    const Fault fault = faultOf(words, outcome.rules.size());
    if (!fault.text.empty()) {
      outcome.error = start + std::to_string(number) + before + fault.text;
      outcome.isWhole = fault.isWhole;
      return outcome;
    }
    outcome.rules.push_back({number, words});
  }
  return outcome;
}

std::string ParseErrorOf(const std::string& domain) {
  return "Error in parsing policy for domain: " + domain + ": ";
}

}  // namespace

PlainOutcome ReadDomainPlainly(const std::string& name, const PlainLines& lines) {
  return ReadUpToFault(lines, ParseErrorOf(name), " : ",
                       [](const PlainWords& words, std::size_t) { return FaultOfRule(words); });
}

std::string PrintedPlainly(const std::vector<PlainRule>& rules) {
  std::map<std::string, std::string> byType;
  for (const PlainRule& rule : rules) {
    // A path rule without letters still has the space in front of them.
    const std::string end = rule.words[0] == "-r" && rule.words.size() == 2 ? " \n" : "\n";
    byType[rule.words[0]] += Joined(rule.words) + end;
  }
  std::string text;
  for (const auto& [type, lines] : byType) text += lines;
  return text + "\n";
}

std::pair<unsigned int, unsigned int> FirstContradiction(const std::vector<PlainRule>& rules) {
  for (std::size_t later = 0; later < rules.size(); ++later) {
    for (std::size_t earlier = 0; earlier < later; ++earlier) {
      PlainWords a = rules[earlier].words;
      PlainWords b = rules[later].words;
      if (a[0] != "-p" || b[0] != "-p" || a.back() == b.back()) continue;
      a.pop_back();
      b.pop_back();
      if (a == b) return {rules[earlier].line, rules[later].line};
    }
  }
  return {0, 0};
}

PlainOutcome ReadObjectsPlainly(const std::string& file, const PlainLines& lines) {
  return ReadUpToFault(lines, file + ":", " : ", [](const PlainWords& words, std::size_t) -> Fault {
    return {words.size() == 1 ? "" : "cannot define more than one object per line"};
  });
}

PlainOutcome ReadFileLabelsPlainly(const std::string& file, const PlainLines& lines) {
  PlainOutcome outcome =
      ReadUpToFault(lines, file + ":", " : ", [](const PlainWords& words, std::size_t) -> Fault {
        if (words.size() != 2) return {"incorrect no of parameters"};
        if (!Contains(kSmallObjects, words[1])) {
          return {"unknown object label \"" + words[1] + "\"", false};
        }
        const std::size_t star = words[0].find("/*");
        const bool isGood = star == std::string::npos || star + 2 == words[0].size();
        return {isGood ? "" : "Unrecognized format for file/dir specification"};
      });
  // The one fault that is reported without its line.
  if (!outcome.isWhole) outcome.error = outcome.error.substr(outcome.error.find("unknown object"));
  return outcome;
}

PlainOutcome ReadTardiskPlainly(const std::string& file, const PlainLines& lines) {
  return ReadUpToFault(lines, ParseErrorOf(file), " : ",
                       [](const PlainWords& words, std::size_t rules) -> Fault {
                         if (words[0] != "-E") {
                           return {"invalid tardisk policy rule type (" + words[0] + ")"};
                         }
                         if (rules > 0) return {"Only one rule of this type is allowed"};
                         if (words.size() != 3) return {kWrongCount};
                         if (!Contains(kSmallDomains, words[2])) {
                           return {"Failed to fetch domain id for " + words[2]};
                         }
                         return {};
                       });
}

void RequireError(const std::string& found, const PlainOutcome& expected) {
  const bool isShort = !expected.isWhole && found.size() > expected.error.size();
  const std::string compared = isShort ? found.substr(0, expected.error.size()) : found;
  RequireEqual(compared, expected.error, "the first bad line is refused with its reason");
  if (!isShort) return;
  const std::string rest = found.substr(expected.error.size());
  Require(rest.starts_with(" (nearest: ") && rest.ends_with(")"),
          "only the nearest word may follow the platform's reason");
}

}  // namespace Fuzz
