// secpolicy may [--host DIR] [--policy SOURCE] [--json] DOMAIN OPERATION OBJECT...
#include <unistd.h>

#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

#include "tools/policy/output.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/asking.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct MayArguments {
  AskingArguments asking;
  std::string domain;
  std::vector<std::string> words;
};

ExitStatus PrintAnswer(const MayArguments& arguments) {
  const AskedPolicy asked = ReadAskedFor(arguments.words, arguments.asking);
  const DomainContent& domain = DomainOf(asked.policy, arguments.domain);
  const Question question = asked.Parse(arguments.words);
  const Answer answer = DomainDecisions(domain).Decide(question);
  if (arguments.asking.isJson) {
    PrintJson(
        MayJson({arguments.asking.policy, arguments.words}, arguments.domain, question, answer));
  } else {
    const Painter painter(WantsColour(STDOUT_FILENO));
    std::cout << painter
                     .Paint(answer.isAllowed ? Colour::kGreen : Colour::kRed,
                            AnswerText(question, answer))
                     .EndLine();
  }
  return answer.isAllowed ? kDone : kFailed;
}

}  // namespace

CommandLine MayVerb() {
  const auto arguments = std::make_shared<MayArguments>();
  return {
      .name = "may",
      .description = "Ask whether a domain is allowed something",
      .footer = "Questions:\n" + QuestionForms() +
                "\nExit status: 0 allowed, 1 not allowed, or an error was reported, 2 wrong usage.",
      .options = AskingOptions(arguments->asking),
      .operands = {{.names = {"DOMAIN"},
                    .description = "The domain",
                    .store = Into(arguments->domain),
                    .isRequired = true},
                   QuestionOperand(arguments->words)},
      .run = [arguments] { return PrintAnswer(*arguments); }};
}

}  // namespace SecPolicyTool
