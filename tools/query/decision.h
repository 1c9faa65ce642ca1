// What a policy decides.
#pragma once

#include <map>
#include <string>

#include "host/engine/domain_rules.h"
#include "tools/policy/policy.h"
#include "tools/policy/terminal.h"
#include "tools/query/question.h"

namespace SecPolicyTool {

// Rules live as long as the policy.
struct Answer {
  bool isAllowed = false;
  // What decided; nullptr when no rule speaks, which does not allow.
  const PolicyRule* rule = nullptr;
  // Of the execution of a file that is allowed: the granted transition that moves the program to
  // another domain; nullptr when it stays in its own.
  const PolicyRule* transition = nullptr;
};

// The decisions of one domain, found without going through its rules: those of the engine
// (host/engine/engine.h) on files, and those of the rule that is asked for on everything else.
// Answers are those of an enforcing domain. Rules for one world decide nothing for their domain.
class DomainDecisions {
 public:
  // `domain` must live as long as this.
  explicit DomainDecisions(const DomainContent& domain);

  [[nodiscard]] Answer Decide(const Question& question) const;

 private:
  [[nodiscard]] Answer DecideOnFile(const AskedFile& file) const;
  [[nodiscard]] const PolicyRule* RuleOf(std::optional<std::size_t> number) const;

  const DomainContent& content_;
  StandIn::DomainRules rules_;  // by their number in content_
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
// not known. For a file "no: no rule for the path or the label LABEL", or "no: no rule for the
// path" when the file has no label. With "; continues in DOMAIN: RULE (PLACE)" for a program that
// is moved.
TerminalText AnswerText(const Question& question, const Answer& answer);

// "RULE (PLACE)", as there.
TerminalText RuleText(const PolicyRule& rule);

}  // namespace SecPolicyTool
