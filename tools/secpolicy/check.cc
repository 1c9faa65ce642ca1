// secpolicy check [--host DIR] [--format text|json|sarif] [--no-warn ID] [--error-on-warning] [DIR]
#include "tools/check/check.h"

#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "tools/check/finding_kinds.h"
#include "tools/check/report_forms.h"
#include "tools/policy/output.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/source_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct CheckArguments {
  std::string host;
  std::string dir;
  std::string format = "text";
  bool isJson = false;
  std::vector<std::string> silenced;
  bool isErrorOnWarning = false;
};

void RemoveSilenced(const std::vector<std::string>& ids, std::vector<Finding>& findings) {
  std::erase_if(findings, [&](const Finding& finding) {
    return finding.severity == Severity::kWarning &&
           std::find(ids.begin(), ids.end(), finding.id) != ids.end();
  });
}

void PrintText(const CheckReport& report) {
  const Painter painter(WantsColour(STDOUT_FILENO));
  for (const Finding& finding : report.findings) std::cout << TextForm(finding, painter);
  // What is on the way has to be there before the summary.
  FlushOutput();
  std::cerr << SummaryForm(report) + "\n";
}

void Print(const CheckReport& report, const CheckArguments& arguments) {
  const std::string format = arguments.isJson ? "json" : arguments.format;
  if (format == "json") {
    PrintJson(JsonForm(report, arguments.dir));
  } else if (format == "sarif") {
    PrintJson(SarifForm(report, arguments.dir));
  } else {
    PrintText(report);
  }
}

ExitStatus Check(const CheckArguments& arguments) {
  CheckReport report = CheckWholePolicy(OpenHost(arguments.host), arguments.dir);
  RemoveSilenced(arguments.silenced, report.findings);
  Print(report, arguments);
  const FindingCounts counts = CountsOf(report);
  const bool isFailed = counts.errors != 0 || (arguments.isErrorOnWarning && counts.warnings != 0);
  return isFailed ? kFailed : kDone;
}

// What is wrong with an id, or nothing.
std::string IdProblem(const std::string& id) {
  return IsWarningId(id) ? "" : "no warning has the id " + id + "; known are: " + WarningIds();
}

}  // namespace

CommandLine CheckVerb() {
  const auto arguments = std::make_shared<CheckArguments>();
  return {.name = "check",
          .description = "Say everything that is wrong with a policy",
          .options = {HostOption(arguments->host),
                      JsonOption(arguments->isJson),
                      {.names = {"--format"},
                       .value = "FORMAT",
                       .description = "The form of the findings",
                       .store = Into(arguments->format),
                       .choices = {"text", "json", "sarif"},
                       .excludes = "--json"},
                      {.names = {"--no-warn"},
                       .value = "ID",
                       .description = "Leave out the warnings of this id",
                       .store = Checked(IdProblem, Into(arguments->silenced)),
                       .isRepeatable = true},
                      {.names = {"--error-on-warning"},
                       .description = "Fail on warnings as on errors",
                       .store = Into(arguments->isErrorOnWarning)}},
          .operands = {OwnPolicyOperand(arguments->dir, "DIR")},
          .run = [arguments] { return Check(*arguments); }};
}

}  // namespace SecPolicyTool
