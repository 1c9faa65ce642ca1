// secpolicy diff [--host DIR] [--json] A B
#include <unistd.h>

#include <iostream>
#include <memory>

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

void AddDiff(CLI::App& app, ExitStatus& status) {
  CLI::App* verb = app.add_subcommand("diff", "Say in what two policies differ");
  verb->footer(
      "+ is only in B, - is only in A, ~ is another in B; nothing is printed when they mean the\n"
      "same. Exit status: 0 equal, 1 different, or an error was reported, 2 wrong usage.");
  const auto arguments = std::make_shared<DiffArguments>();
  AddHostOption(*verb, arguments->host);
  AddJsonOption(*verb, arguments->isJson);
  AddSourceOption(*verb, arguments->before, "A");
  AddSourceOption(*verb, arguments->after, "B");
  verb->callback([arguments, &status] { status = Diff(*arguments); });
}

}  // namespace SecPolicyTool
