// The forms in which the findings of a check are handed over.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>

#include "tools/check/check.h"
#include "tools/policy/terminal.h"

namespace SecPolicyTool {

// How many findings are errors, and how many are warnings.
struct FindingCounts {
  std::size_t errors = 0;
  std::size_t warnings = 0;
};
FindingCounts CountsOf(const CheckReport& report);

// "FILE:LINE:COLUMN: error: MESSAGE [id]", the line, the mark below it and "help: ...", each on a
// line of its own; "" for nothing.
TerminalText TextForm(const Finding& finding, const Painter& painter);

// "2 errors, 1 warning in 14 files".
std::string SummaryForm(const CheckReport& report);

// docs/schemas/check.schema.json. `source` is the directory as given.
nlohmann::json JsonForm(const CheckReport& report, const std::string& source);

// A log of SARIF 2.1.0. `source` is the directory as given, empty for the host's own one; paths of
// its files are relative to it, those of other files to the host's root.
nlohmann::json SarifForm(const CheckReport& report, const std::string& source);

}  // namespace SecPolicyTool
