// secpolicy test [--host DIR] [--policy SOURCE] [--format FORMAT] FILE
#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>
#include <stdexcept>

#include "host/files/file_io.h"
#include "host/files/system_failure.h"
#include "host/text/escaped.h"
#include "tools/policy/output.h"
#include "tools/query/test_report.h"
#include "tools/secpolicy/asking.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct TestArguments {
  AskingArguments asking;
  std::string format = "text";
  std::string file;
};

std::string ContentOf(const std::string& path) {
  const StandIn::UniqueFd file(open(path.c_str(), O_RDONLY | O_CLOEXEC));
  if (file.Get() < 0) throw StandIn::SystemFailure(path, "opened", errno);
  return StandIn::ReadAll(file.Get(), path);
}

// A file with a mistake is not run: what is left of it could pass for the whole.
std::vector<Statement> StatementsIn(const PolicyText& text, const AskedPolicy& asked,
                                    const std::string& path) {
  StatementFile file = ParseStatements(text, asked.vocabulary,
                                       [&](const std::string& name) { return asked.FileAt(name); });
  for (const StatementProblem& problem : file.problems) {
    ReportError(StandIn::Escaped(path).Text() + ":" + std::to_string(problem.line) + ":" +
                std::to_string(problem.column) + ": " + problem.text);
  }
  if (!file.problems.empty()) throw std::runtime_error(path + " has mistakes; nothing was tested");
  if (file.statements.empty()) throw std::runtime_error(path + " has no statements");
  return std::move(file.statements);
}

void Print(const TestRun& run, const std::string& format) {
  if (format == "json") {
    PrintJson(TestJson(run));
  } else if (format == "tap") {
    PrintTap(run, std::cout);
  } else {
    PrintText(run, Painter(WantsColour(STDOUT_FILENO)), std::cout);
  }
}

ExitStatus Test(const TestArguments& arguments) {
  const PolicyText text = ReadPolicyText(ContentOf(arguments.file));
  const AskedPolicy asked = ReadAsked(arguments.asking, OnErrors::kRefuse);
  TestRun run{
      arguments.file, arguments.asking.policy, StatementsIn(text, asked, arguments.file), {}};
  run.outcomes = Judge(asked.policy, run.statements);
  Print(run, arguments.asking.isJson ? "json" : arguments.format);
  return run.Failed() == 0 ? kDone : kFailed;
}

}  // namespace

CommandLine TestVerb() {
  const auto arguments = std::make_shared<TestArguments>();
  CommandLine verb{
      .name = "test",
      .description = "Run the unit tests of a policy",
      .footer =
          "A line of FILE is one of\n" + StatementForms() + "\nwith a question such as\n" +
          QuestionForms() +
          "\nExit status: 0 all hold, 1 some do not, or an error was reported, 2 wrong usage.",
      .options = AskingOptions(arguments->asking),
      .operands = {{.names = {"FILE"},
                    .value = "FILE",
                    .description = "The statements that have to hold",
                    .store = Into(arguments->file),
                    .isRequired = true}},
      .run = [arguments] { return Test(*arguments); }};
  verb.options.push_back({.names = {"--format"},
                          .value = "FORMAT",
                          .description = "text, as without it, tap or json",
                          .store = Into(arguments->format),
                          .choices = {"text", "tap", "json"},
                          .excludes = "--json"});
  return verb;
}

}  // namespace SecPolicyTool
