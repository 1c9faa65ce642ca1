// What the verbs that ask a policy have in common.
#pragma once

#include <CLI/CLI.hpp>
#include <string>
#include <vector>

#include "tools/requests/questions.h"
#include "tools/secpolicy/source_option.h"

namespace SecPolicyTool {

struct AskingArguments {
  std::string host;
  std::string policy;
  bool isJson = false;
};

// Adds "--host", "--policy" and "--json".
void AddAskingOptions(CLI::App& verb, AskingArguments& arguments);

// Adds the positional arguments of a question, to be read in the verb's callback.
void AddQuestion(CLI::App& verb, std::vector<std::string>& words);

// The policy that is asked. Throws as ReadPolicy does.
AskedPolicy ReadAsked(const AskingArguments& arguments, OnErrors onErrors);

// The same for a question, whose form is checked first. Throws CLI::ValidationError when that is
// wrong.
AskedPolicy ReadAskedFor(const std::vector<std::string>& words, const AskingArguments& arguments);

}  // namespace SecPolicyTool
