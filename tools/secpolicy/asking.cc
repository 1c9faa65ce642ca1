#include "tools/secpolicy/asking.h"

#include <utility>

#include "tools/secpolicy/host_option.h"

namespace SecPolicyTool {

std::vector<CommandOption> AskingOptions(AskingArguments& arguments) {
  return {HostOption(arguments.host), JsonOption(arguments.isJson), PolicyOption(arguments.policy)};
}

CommandOption QuestionOperand(std::vector<std::string>& words) {
  return {.names = {"OPERATION"},
          .value = "OBJECT",
          .description = "What is asked about, and of what",
          .store = Into(words),
          .isRequired = true,
          .isRepeatable = true};
}

AskedPolicy ReadAsked(const AskingArguments& arguments, OnErrors onErrors) {
  Policy policy = ReadPolicy(arguments.host, arguments.policy, onErrors);
  return {std::move(policy), OpenHost(arguments.host)};
}

AskedPolicy ReadAskedFor(const std::vector<std::string>& words, const AskingArguments& arguments) {
  try {
    CheckForm(words);
  } catch (const BadQuestion& problem) {
    throw UsageError("OPERATION", problem.what());
  }
  return ReadAsked(arguments, OnErrors::kWarn);
}

}  // namespace SecPolicyTool
