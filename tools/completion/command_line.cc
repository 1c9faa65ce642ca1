#include "tools/completion/command_line.h"

#include <sstream>

namespace SecPolicyTool {

using nlohmann::json;

namespace {

// CLI11 shows a closed set of values as "TYPE:{a,b,c}".
std::vector<std::string> ChoicesOf(const std::string& type) {
  const std::size_t open = type.find('{');
  const std::size_t close = type.rfind('}');
  if (open == std::string::npos || close == std::string::npos) return {};
  std::vector<std::string> choices;
  std::istringstream list(type.substr(open + 1, close - open - 1));
  for (std::string choice; std::getline(list, choice, ',');) choices.push_back(choice);
  return choices;
}

CommandOption OptionOf(const CLI::Option& option) {
  CommandOption described;
  for (const std::string& name : option.get_snames()) described.names.push_back("-" + name);
  for (const std::string& name : option.get_lnames()) described.names.push_back("--" + name);
  if (described.names.empty()) described.names.push_back(option.get_name(true, false));
  if (option.get_items_expected_max() != 0) {
    const std::string type = option.get_type_name();
    described.choices = ChoicesOf(type);
    described.value = type.substr(0, type.find(":{"));
  }
  described.description = option.get_description();
  described.isRequired = option.get_required();
  return described;
}

json ToJson(const std::vector<CommandOption>& options) {
  json entries = json::array();
  for (const CommandOption& option : options) {
    entries.push_back({{"names", option.names},
                       {"value", option.value},
                       {"choices", option.choices},
                       {"description", option.description},
                       {"required", option.isRequired}});
  }
  return entries;
}

}  // namespace

CommandLine CommandLineOf(const CLI::App& app) {
  CommandLine line{app.get_name(), app.get_description(), {}, {}, {}};
  for (const CLI::Option* option : app.get_options()) {
    (option->nonpositional() ? line.options : line.positionals).push_back(OptionOf(*option));
  }
  for (const CLI::App* verb : app.get_subcommands(nullptr)) {
    line.verbs.push_back(CommandLineOf(*verb));
  }
  return line;
}

json ToJson(const CommandLine& line) {
  json verbs = json::array();
  for (const CommandLine& verb : line.verbs) verbs.push_back(ToJson(verb));
  return {{"name", line.name},
          {"description", line.description},
          {"options", ToJson(line.options)},
          {"positionals", ToJson(line.positionals)},
          {"verbs", std::move(verbs)}};
}

}  // namespace SecPolicyTool
