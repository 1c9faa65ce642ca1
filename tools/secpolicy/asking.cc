#include "tools/secpolicy/asking.h"

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

Question AskedPolicy::Parse(const std::vector<std::string>& words) const {
  return ParseQuestion(words, vocabulary,
                       [this](const std::string& path) { return paths.Resolve(path); });
}

AskedPolicy ReadAsked(const AskingArguments& arguments, OnErrors onErrors) {
  Policy policy = ReadPolicy(arguments.host, arguments.policy, onErrors);
  const StandIn::HostDirectory host = OpenHost(arguments.host);
  Vocabulary vocabulary = VocabularyOf(host, policy);
  return {std::move(policy), std::move(vocabulary), HostPaths(host)};
}

AskedPolicy ReadAskedFor(const std::vector<std::string>& words, const AskingArguments& arguments) {
  try {
    CheckForm(words);
  } catch (const BadQuestion& problem) {
    throw CLI::ValidationError("OPERATION", problem.what());
  }
  return ReadAsked(arguments, OnErrors::kWarn);
}

nlohmann::json AskedJson(const AskingArguments& arguments, const std::vector<std::string>& words,
                         const Question& question) {
  nlohmann::json entry{{"policy", arguments.policy},
                       {"operation", words.front()},
                       {"objects", std::vector<std::string>(words.begin() + 1, words.end())},
                       {"type", InfoOf(question.key.type).keyword}};
  if (question.key.type == RuleType::kPath) entry["path"] = question.key.words[0];
  return entry;
}

}  // namespace SecPolicyTool
