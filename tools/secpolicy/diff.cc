// secpolicy diff [--host DIR] [--json] A B
#include <unistd.h>

#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "tools/policy/output.h"
#include "tools/query/difference_report.h"
#include "tools/query/host_paths.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/source_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct DiffArguments {
  std::string host;
  std::string before;
  std::string after;
  bool isJson = false;
};

ExitStatus Diff(const DiffArguments& arguments) {
  const Difference difference =
      Compare(ReadPolicy(arguments.host, arguments.before, OnErrors::kWarn),
              ReadPolicy(arguments.host, arguments.after, OnErrors::kWarn));
  if (arguments.isJson) {
    nlohmann::json content = DifferenceJson(difference);
    content["a"] = arguments.before;
    content["b"] = arguments.after;
    content["equal"] = difference.IsEmpty();
    PrintJson(content);
  } else if (!difference.IsEmpty()) {
    PrintDifference(difference, LabelablePaths(OpenHost(arguments.host)),
                    Painter(WantsColour(STDOUT_FILENO)), std::cout);
  }
  return difference.IsEmpty() ? kDone : kFailed;
}

}  // namespace

CommandLine DiffVerb() {
  const auto arguments = std::make_shared<DiffArguments>();
  return {.name = "diff",
          .description = "Say in what two policies differ",
          .footer =
              "+ is only in B, - is only in A, ~ is another in B; nothing is printed when they "
              "mean the\nsame. Exit status: 0 equal, 1 different, or an error was reported, 2 "
              "wrong usage.",
          .options = {HostOption(arguments->host), JsonOption(arguments->isJson)},
          .operands = {SourceOperand(arguments->before, "A"), SourceOperand(arguments->after, "B")},
          .run = [arguments] { return Diff(*arguments); }};
}

}  // namespace SecPolicyTool
