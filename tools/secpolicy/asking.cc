#include "tools/secpolicy/asking.h"

#include <utility>

#include "tools/secpolicy/host_option.h"

namespace SecPolicyTool {

void AddAskingOptions(CLI::App& verb, AskingArguments& arguments) {
  AddHostOption(verb, arguments.host);
  AddJsonOption(verb, arguments.isJson);
  AddPolicyOption(verb, arguments.policy);
}

void AddQuestion(CLI::App& verb, std::vector<std::string>& words) {
  verb.add_option("OPERATION", words, "What is asked about, and of what")
      ->type_name("OPERATION OBJECT...")
      ->required();
}

AskedPolicy ReadAsked(const AskingArguments& arguments, OnErrors onErrors) {
  Policy policy = ReadPolicy(arguments.host, arguments.policy, onErrors);
  return {std::move(policy), OpenHost(arguments.host)};
}

AskedPolicy ReadAskedFor(const std::vector<std::string>& words, const AskingArguments& arguments) {
  try {
    CheckForm(words);
  } catch (const BadQuestion& problem) {
    throw CLI::ValidationError("OPERATION", problem.what());
  }
  return ReadAsked(arguments, OnErrors::kWarn);
}

}  // namespace SecPolicyTool
