// The rules of one domain, as the decision engine looks them up.
#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "host/module/rule.h"

namespace StandIn {

// What a rule says, and the number by which verdicts name it.
struct NumberedRule {
  bool isGranted = false;        // of rules that end in a decision
  std::uint32_t permission = 0;  // of path rules: bits of kPermissionBits
  std::size_t number = 0;
};

// A rule, and the one of its words that an operation gets from it: the domain to which a program
// goes, or the label of a new file. Both nullptr where there is no rule.
struct RuleWithResult {
  const NumberedRule* rule = nullptr;
  const std::string* result = nullptr;
};

// What the look-ups give lives as long as the set and its next change. Each takes time that grows
// with the logarithm of the number of rules.
class DomainRules {
 public:
  DomainRules() = default;
  DomainRules(DomainRules&&) = default;
  DomainRules& operator=(DomainRules&&) = default;
  DomainRules(const DomainRules&) = delete;  // the groups point into byWords_
  DomainRules& operator=(const DomainRules&) = delete;
  ~DomainRules() = default;

  // Adds a rule with as many words as InfoOf(type) says; rules come in the order in which they were
  // set. One with the type and words of an earlier rule replaces that, in its place. Paths that
  // differ in doubled slashes or in one at the end are the same.
  void Add(RuleType type, std::vector<std::string> words, const NumberedRule& rule);

  // The rule with these words; nullptr for none.
  [[nodiscard]] const NumberedRule* Find(RuleType type,
                                         const std::vector<std::string>& words) const;
  // The path rule with the longest path that is `path`, an absolute one, or a directory above it;
  // nullptr for none.
  [[nodiscard]] const NumberedRule* FindForPath(const std::string& path) const;

  // The first granted rule that was set for this label and event, or this label of a directory and
  // type of files. Where none is granted, the first revoked one.
  [[nodiscard]] RuleWithResult FindTransition(const std::string& label,
                                              const std::string& event) const;
  [[nodiscard]] RuleWithResult FindCreation(const std::string& parentLabel,
                                            const std::string& fileType) const;

 private:
  using Key = std::pair<RuleType, std::vector<std::string>>;
  // Rules that differ only in the word that an operation gets from them, by the two other words.
  using Groups = std::map<std::pair<std::string, std::string>, std::vector<RuleWithResult>>;

  static RuleWithResult FirstOf(const Groups& groups, const std::string& label,
                                const std::string& word);

  std::map<Key, NumberedRule> byWords_;
  Groups transitions_;
  Groups creations_;
};

}  // namespace StandIn
