// secpolicy may [--host DIR] [--policy SOURCE] [--json] DOMAIN OPERATION OBJECT...
#include <unistd.h>

#include <iostream>
#include <memory>

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
    std::cout << painter.Paint(answer.isAllowed ? Colour::kGreen : Colour::kRed, AnswerText(answer))
              << "\n";
  }
  return answer.isAllowed ? kDone : kFailed;
}

}  // namespace

void AddMay(CLI::App& app, ExitStatus& status) {
  CLI::App* verb = app.add_subcommand("may", "Ask whether a domain is allowed something");
  verb->footer("Questions:\n" + QuestionForms() +
               "\nExit status: 0 allowed, 1 not allowed, or an error was reported, 2 wrong usage.");
  const auto arguments = std::make_shared<MayArguments>();
  AddAskingOptions(*verb, arguments->asking);
  verb->add_option("DOMAIN", arguments->domain, "The domain")->required();
  AddQuestion(*verb, arguments->words);
  verb->callback([arguments, &status] { status = PrintAnswer(*arguments); });
}

}  // namespace SecPolicyTool
