// secpolicy check [--host DIR] [--format text|json|sarif] [--no-warn ID] [--error-on-warning] [DIR]
#include "tools/check/check.h"

#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <memory>

#include "tools/check/finding_kinds.h"
#include "tools/check/report_forms.h"
#include "tools/policy/output.h"
#include "tools/secpolicy/host_option.h"
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

// For CLI11: the text of what is wrong with an id, or nothing.
std::string IdProblem(const std::string& id) {
  return IsWarningId(id) ? "" : "no warning has the id " + id + "; known are: " + WarningIds();
}

}  // namespace

void AddCheck(CLI::App& app, ExitStatus& status) {
  CLI::App* verb = app.add_subcommand("check", "Say everything that is wrong with a policy");
  const auto arguments = std::make_shared<CheckArguments>();
  AddHostOption(*verb, arguments->host);
  AddJsonOption(*verb, arguments->isJson);
  verb->add_option("--format", arguments->format, "The form of the findings")
      ->excludes("--json")
      ->type_name("text|json|sarif")
      ->check(CLI::IsMember({"text", "json", "sarif"}));
  verb->add_option("--no-warn", arguments->silenced, "Leave out the warnings of this id")
      ->type_name("ID")
      ->allow_extra_args(false)  // what follows is the policy directory
      ->check(IdProblem);
  verb->add_flag("--error-on-warning", arguments->isErrorOnWarning,
                 "Fail on warnings as on errors");
  verb->add_option("DIR", arguments->dir,
                   "The policy directory; without it, the host's own /etc/olvane/secpolicy");
  verb->callback([arguments, &status] { status = Check(*arguments); });
}

}  // namespace SecPolicyTool
