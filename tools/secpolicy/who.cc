// secpolicy who [--host DIR] [--policy SOURCE] [--json] OPERATION OBJECT...
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "tools/policy/output.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/asking.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct WhoArguments {
  AskingArguments asking;
  std::vector<std::string> words;
};

ExitStatus PrintAllowed(const WhoArguments& arguments) {
  const AskedPolicy asked = ReadAskedFor(arguments.words, arguments.asking);
  const Question question = asked.Parse(arguments.words);
  const std::vector<AllowedDomain> allowed = AllowedBy(asked.policy, question);
  if (arguments.asking.isJson) {
    PrintJson(WhoJson({arguments.asking.policy, arguments.words}, question, allowed));
  } else {
    for (const AllowedDomain& each : allowed) {
      std::cout << (TerminalText(each.name) + ": " + RuleText(*each.rule)).EndLine();
    }
  }
  return allowed.empty() ? kFailed : kDone;
}

}  // namespace

CommandLine WhoVerb() {
  const auto arguments = std::make_shared<WhoArguments>();
  return {.name = "who",
          .description = "Ask which domains are allowed something",
          .footer = "Questions:\n" + QuestionForms() +
                    "\nExit status: 0 some domain is, 1 none is, or an error was reported, 2 wrong "
                    "usage.",
          .options = AskingOptions(arguments->asking),
          .operands = {QuestionOperand(arguments->words)},
          .run = [arguments] { return PrintAllowed(*arguments); }};
}

}  // namespace SecPolicyTool
