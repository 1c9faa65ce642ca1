// What a report says.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "tools/check/finding.h"
#include "tools/graph/transition_graph.h"
#include "tools/policy/policy.h"
#include "tools/report/drawing.h"

namespace SecPolicyTool {

struct Report {
  std::string source;  // as its user names it
  Policy policy;
  // Nothing for what a kernel holds, which has no files to check.
  std::optional<std::vector<Finding>> findings;
  Drawing drawing;  // of the policy's transitions
};

// The report as one page that needs nothing else: no other file, no network. Scripts of its own
// make it searchable, and no others run in it, whatever the policy says. The same report gives the
// same bytes.
std::string ReportPage(const Report& report);

}  // namespace SecPolicyTool
