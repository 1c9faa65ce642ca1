// What the verbs that ask a policy have in common.
#pragma once

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

// "--host", "--json" and "--policy".
std::vector<CommandOption> AskingOptions(AskingArguments& arguments);

// The words of a question: all that are left.
CommandOption QuestionOperand(std::vector<std::string>& words);

// The policy that is asked. Throws as ReadPolicy does.
AskedPolicy ReadAsked(const AskingArguments& arguments, OnErrors onErrors);

// The same for a question, whose form is checked first. Throws UsageError when that is wrong.
AskedPolicy ReadAskedFor(const std::vector<std::string>& words, const AskingArguments& arguments);

}  // namespace SecPolicyTool
