// secpolicy report [--host DIR] [--json] -o FILE SOURCE
#include "tools/report/report.h"

#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "tools/check/check.h"
#include "tools/policy/output.h"
#include "tools/policy/output_file.h"
#include "tools/policy/terminal.h"
#include "tools/query/digest.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/source_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct ReportArguments {
  std::string host;
  std::string source;
  std::string file;
  bool isJson = false;
};

void Warn(const std::string& text) {
  PrintLine(std::cerr, "Warning: " + text + "; the transitions are drawn without it");
}

Report MakeReport(const ReportArguments& arguments) {
  Report report;
  report.source = arguments.source;
  report.policy = ReadPolicy(arguments.host, arguments.source, OnErrors::kWarn);
  if (arguments.source != kKernelSource) {
    report.findings = CheckPolicy(OpenHost(arguments.host), arguments.source);
  }
  report.drawing = Draw(TransitionGraph(report.policy), Warn);
  return report;
}

void WriteReport(const ReportArguments& arguments) {
  const Report report = MakeReport(arguments);
  WriteOutputFile(arguments.file, ReportPage(report));
  if (!arguments.isJson) return;
  nlohmann::json content{{"source", arguments.source},
                         {"file", arguments.file},
                         {"sha256", Digest(report.policy)},
                         {"findings", nullptr}};
  if (report.findings) content["findings"] = report.findings->size();
  PrintJson(content);
}

}  // namespace

CommandLine ReportVerb() {
  const auto arguments = std::make_shared<ReportArguments>();
  return {
      .name = "report",
      .description = "Write a page that shows what a policy says",
      .options = {HostOption(arguments->host),
                  JsonOption(arguments->isJson),
                  {.names = {"-o", "--output"},
                   .value = "FILE",
                   .description = "The page: one HTML file that needs no other; written whole or "
                                  "not at all",
                   .store = Into(arguments->file),
                   .isRequired = true}},
      .operands = {SourceOperand(arguments->source)},
      .run = [arguments] {
        WriteReport(*arguments);
        return kDone;
      }};
}

}  // namespace SecPolicyTool
