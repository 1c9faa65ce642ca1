// What a policy is expected to decide: the unit tests of policies.
//
//   may DOMAIN OPERATION OBJECT...      the domain is allowed that
//   never DOMAIN OPERATION OBJECT...    it is not
//   reaches FROM TO [EVENT]             there is a way of granted transitions
//   unreachable FROM TO [EVENT]         there is none
//
// One statement a line; words, blanks and comments are those of policy files.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "tools/policy/policy_text.h"
#include "tools/query/question.h"

namespace SecPolicyTool {

enum class StatementKind : std::uint8_t { kMay, kNever, kReaches, kUnreachable };

struct Statement {
  StatementKind kind = StatementKind::kMay;
  unsigned int line = 0;
  std::string text;    // its words, with single blanks between them
  std::string domain;  // or where the way begins
  Question question;   // of kMay and kNever
  std::string target;  // of the others
  std::optional<std::string> event;
};

struct StatementProblem {
  unsigned int line = 0;
  unsigned int column = 0;
  std::string text;
};

struct StatementFile {
  std::vector<Statement> statements;
  std::vector<StatementProblem> problems;  // in the order of their places, one a line
};

// The statements in `text`. A problem's text is that of BadQuestion, or
//   "unknown statement "WORD" (nearest: NEAREST)"
//   "WORD takes other words: FORM"
//   "unknown domain "NAME" (nearest: OTHER)"
//   "unknown transition event "WORD" (nearest: NEAREST)"
//   "the line is longer than 1023 bytes; what is behind it is not read"
StatementFile ParseStatements(const PolicyText& text, const Vocabulary& vocabulary,
                              const FileResolver& resolve);

// The forms of statements, a line each, for help.
std::string StatementForms();

}  // namespace SecPolicyTool
