// What a policy decides on the statements about it.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "tools/query/decision.h"
#include "tools/query/reach.h"
#include "tools/query/statements.h"

namespace SecPolicyTool {

// What a policy says to a statement. What it points to lives as long as the policy.
struct Outcome {
  bool holds = false;
  Answer answer;                         // of kMay and kNever
  std::optional<std::vector<Step>> way;  // of the others; nothing when there is none
};

// An outcome for each statement, in their order.
std::vector<Outcome> Judge(const Policy& policy, const std::vector<Statement>& statements);

// What the policy says: AnswerText, or "no way", "the same domain", or
// "FROM -> TO: RULE (PLACE)" for each step, with commas between them.
TerminalText OutcomeText(const Statement& statement, const Outcome& outcome);

}  // namespace SecPolicyTool
