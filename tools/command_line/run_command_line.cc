// The one place that knows the library which parses command lines.
#include <CLI/CLI.hpp>
#include <algorithm>
#include <set>
#include <string_view>

#include "host/text/escaped.h"
#include "tools/command_line/command_line.h"

namespace SecPolicyTool {

namespace {

std::string Joined(const std::vector<std::string>& words, const char* separator) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : separator) + word;
  return text;
}

bool IsOperand(const CommandOption& option) { return !option.names.front().starts_with('-'); }

void RequireChoice(const CommandOption& option, const std::string& value) {
  const auto& choices = option.choices;
  if (choices.empty() || std::find(choices.begin(), choices.end(), value) != choices.end()) return;
  throw std::invalid_argument("\"" + StandIn::Escaped(value).Text() + "\" is none of " +
                              Joined(choices, ", "));
}

void StoreValues(const CommandOption& option, const CLI::results_t& values) try {
  for (const std::string& value : values) {
    RequireChoice(option, value);
    option.store(value);
  }
} catch (const std::invalid_argument& problem) {
  throw CLI::ValidationError(option.names.back(), problem.what());
}

void AddFlag(CLI::App& app, const CommandOption& option) {
  app.add_flag_callback(
      Joined(option.names, ","), [&option] { option.store(""); }, option.description);
}

// How the value is shown in the help; the name of an operand may say it already.
std::string ValueText(const CommandOption& option) {
  if (option.value == option.names.front()) return "";
  return option.choices.empty() ? option.value : Joined(option.choices, "|");
}

void AddValue(CLI::App& app, const CommandOption& option) {
  CLI::Option* added = app.add_option(
      Joined(option.names, ","),
      [&option](const CLI::results_t& values) {
        StoreValues(option, values);
        return true;
      },
      option.description);
  added->type_name(ValueText(option));
  if (!option.defaultValue.empty()) added->default_str(option.defaultValue);
  if (option.isRequired) added->required();
  if (option.isRepeatable) {
    added->expected(1, CLI::detail::expected_max_vector_size)->allow_extra_args(IsOperand(option));
  }
}

// Between options, which have to be there already.
void AddRelations(CLI::App& app, const CommandOption& option) {
  CLI::Option* added = app.get_option(option.names.back());
  if (!option.excludes.empty()) added->excludes(app.get_option(option.excludes));
  if (!option.needs.empty()) added->needs(app.get_option(option.needs));
}

// The app refers to `line`, and `chosen` becomes the one whose words are there. Verbs that none of
// `words` names only have their names: to describe all of them takes longer than to parse.
void Describe(CLI::App& app, const CommandLine& line, const std::set<std::string_view>& words,
              const CommandLine*& chosen) {
  if (!line.footer.empty()) app.footer(line.footer);
  if (!line.version.empty()) app.set_version_flag("--version", line.version);
  for (const CommandOption& option : line.options) {
    if (option.value.empty()) {
      AddFlag(app, option);
    } else {
      AddValue(app, option);
    }
  }
  for (const CommandOption& option : line.options) AddRelations(app, option);
  for (const CommandOption& operand : line.operands) AddValue(app, operand);
  if (!line.verbs.empty()) app.require_subcommand(1);
  for (const CommandLine& verb : line.verbs) {
    CLI::App* added = app.add_subcommand(verb.name, verb.description);
    if (words.contains(verb.name)) Describe(*added, verb, words, chosen);
  }
  if (line.run) app.callback([&line, &chosen] { chosen = &line; });
}

}  // namespace

ExitStatus RunCommandLine(const CommandLine& line, int argc, const char* const* argv) {
  CLI::App app(line.description, line.name);
  const CommandLine* chosen = nullptr;
  Describe(app, line, {argv, argv + argc}, chosen);
  try {
    app.parse(argc, argv);
    return chosen->run();
  } catch (const CLI::ParseError& outcome) {
    // Help and version arrive as errors too; those have exit code 0.
    return app.exit(outcome) == 0 ? kDone : kUsage;
  } catch (const UsageError& problem) {
    app.exit(CLI::ValidationError(problem.Subject(), problem.what()));
    return kUsage;
  }
}

}  // namespace SecPolicyTool
