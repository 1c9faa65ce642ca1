// secpolicy completion bash|zsh|json
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "tools/policy/output.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

ExitStatus PrintDescription(const CommandLine& line, const std::string& form) {
  if (form == "json") {
    PrintJson(ToJson(line));
  } else {
    std::cout << (form == "bash" ? BashCompletion(line) : ZshCompletion(line));
  }
  return kDone;
}

}  // namespace

CommandLine CompletionVerb(const CommandLine& line) {
  const auto form = std::make_shared<std::string>();
  return {.name = "completion",
          .description = "Print what completes the command line in a shell, or describes it",
          .operands = {{.names = {"FORM"},
                        .description = "A shell, whose script is to be sourced; json for a "
                                       "description of all verbs",
                        .store = Into(*form),
                        .choices = {"bash", "zsh", "json"},
                        .isRequired = true}},
          .run = [&line, form] { return PrintDescription(line, *form); }};
}

}  // namespace SecPolicyTool
