// What a domain's rules decided on so far.
#pragma once

#include <string>
#include <unordered_map>
#include <vector>

#include "tools/check/check_context.h"
#include "tools/policy/policy.h"

namespace SecPolicyTool {

// A line of a domain file in which nothing is wrong.
struct GoodRule {
  RuleType type = RuleType::kSyscall;
  const PolicyLine* line = nullptr;
  // What it decides on: the words, joined by blanks; of a path rule the path as the kernel resolves
  // it.
  std::string words;
  std::string decision;  // or permission
};

// The rules of one file, in their order. Compares each with the ones before.
class RuleMemory {
 public:
  RuleMemory(const CheckedFile& file, CheckContext& context) : file_(file), context_(context) {}

  // Adds what the rule repeats or contradicts.
  void Add(const GoodRule& rule);

  // Stores which domains the granted transitions lead to.
  void NoteTransitions() const;

 private:
  struct Seen {
    RuleType type;
    unsigned int line;
    std::string decision;
    unsigned int firstLine;
    std::string firstDecision;
    const PolicyLine* text;
  };

  void Compare(const GoodRule& rule, const Seen& seen);
  void AddContradictoryParameter(const GoodRule& rule, const Seen& seen);

  const CheckedFile& file_;
  CheckContext& context_;
  std::unordered_map<std::string, Seen> seen_;
};

}  // namespace SecPolicyTool
