// secpolicy completion bash|zsh|json
#include <iostream>
#include <memory>

#include "tools/completion/command_line.h"
#include "tools/policy/output.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

void AddCompletion(CLI::App& app, ExitStatus&) {
  CLI::App* verb = app.add_subcommand(
      "completion", "Print what completes the command line in a shell, or describes it");
  const auto form = std::make_shared<std::string>();
  verb->add_option("FORM", *form,
                   "A shell, whose script is to be sourced; json for a description of all verbs")
      ->required()
      ->check(CLI::IsMember({"bash", "zsh", "json"}));
  verb->callback([form, &app] {
    const CommandLine line = CommandLineOf(app);
    if (*form == "json") {
      PrintJson(ToJson(line));
    } else {
      std::cout << (*form == "bash" ? BashCompletion(line) : ZshCompletion(line));
    }
  });
}

}  // namespace SecPolicyTool
