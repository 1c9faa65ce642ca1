// What a policy decides.
#pragma once

#include <map>
#include <string>

#include "tools/policy/policy.h"
#include "tools/policy/terminal.h"
#include "tools/query/question.h"

namespace SecPolicyTool {

struct Answer {
  bool isAllowed = false;
  // What decided; nullptr when no rule speaks, which does not allow. Lives as long as the policy.
  const PolicyRule* rule = nullptr;
};

// The decisions of one domain, found without going through its rules.
//
// Of path rules the one with the longest path decides that is the asked one or a directory above
// it. Rules for one world decide nothing for their domain.
class DomainDecisions {
 public:
  // `domain` must live as long as this.
  explicit DomainDecisions(const DomainContent& domain);

  [[nodiscard]] Answer Decide(const Question& question) const;

 private:
  [[nodiscard]] const PolicyRule* Find(const RuleKey& key) const;
  [[nodiscard]] const PolicyRule* FindAbove(const std::string& path) const;

  std::map<RuleKey, const PolicyRule*> rules_;
};

// Those of all domains of a policy, which must live as long as this.
class Decisions {
 public:
  explicit Decisions(const Policy& policy);

  // Throws std::out_of_range when there is no such domain.
  [[nodiscard]] Answer Decide(const std::string& domain, const Question& question) const;

 private:
  std::map<std::string, DomainDecisions> domains_;
};

// A single question. Throws std::out_of_range when there is no such domain.
Answer Decide(const Policy& policy, const std::string& domain, const Question& question);

// "yes: RULE (PLACE)", "no: RULE (PLACE)" or "no: no rule"; without the bracket when the place is
// not known.
TerminalText AnswerText(const Answer& answer);

// "RULE (PLACE)", as there.
TerminalText RuleText(const PolicyRule& rule);

}  // namespace SecPolicyTool
