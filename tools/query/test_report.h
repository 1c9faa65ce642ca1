// How the outcome of a policy's unit tests is told.
#pragma once

#include <iosfwd>
#include <nlohmann/json_fwd.hpp>
#include <string>
#include <vector>

#include "tools/policy/terminal.h"
#include "tools/query/outcomes.h"

namespace SecPolicyTool {

// A file of statements and what became of them; the outcomes in the order of the statements.
struct TestRun {
  std::string file;
  std::string policy;  // the source
  std::vector<Statement> statements;
  std::vector<Outcome> outcomes;

  [[nodiscard]] std::size_t Failed() const;
};

// `FILE:LINE: expected "STATEMENT", but OUTCOME` for each that failed, then
// "N statements, M failed".
void PrintText(const TestRun& run, const Painter& painter, std::ostream& out);

// The Test Anything Protocol, version 13.
void PrintTap(const TestRun& run, std::ostream& out);

nlohmann::json TestJson(const TestRun& run);

}  // namespace SecPolicyTool
