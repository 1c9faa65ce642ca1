// Completion for zsh.
#include "tools/command_line/command_line.h"

namespace SecPolicyTool {

namespace {

// `text` within single quotes, as part of what _arguments takes, in which some characters
// mean something.
std::string QuotedForZsh(const std::string& text) {
  std::string escaped;
  for (const char c : text) {
    if (c == '\'') {
      escaped += "'\\''";
    } else if (std::string_view("[]:\\").find(c) != std::string_view::npos) {
      escaped += std::string("\\") + c;
    } else {
      escaped += c;
    }
  }
  return escaped;
}

// What zsh is to offer for a value: its message and its action.
std::string Action(const CommandOption& option) {
  const bool isPositional = !option.names[0].starts_with('-');
  std::string action = ":" + QuotedForZsh(isPositional ? option.names[0] : option.value) + ":";
  if (!option.choices.empty()) {
    action += "(";
    for (const std::string& choice : option.choices) action += choice + " ";
    action.back() = ')';
  } else if (option.value == "DIR" || option.value == "DIR|kernel") {
    action += "_files -/";
  } else if (option.value == "FILE") {
    action += "_files";
  } else {
    action += " ";
  }
  return action;
}

std::string OptionSpecs(const CommandOption& option) {
  std::string specs;
  for (const std::string& name : option.names) {
    specs += " \\\n    '*" + name + "[" + QuotedForZsh(option.description) + "]" +
             (option.value.empty() ? "" : Action(option)) + "'";
  }
  return specs;
}

std::string Arguments(const CommandLine& line) {
  std::string arguments = "  _arguments -s";
  for (const CommandOption& option : AllOptions(line)) arguments += OptionSpecs(option);
  for (const CommandOption& option : line.operands) {
    arguments += " \\\n    '" + Action(option) + "'";
  }
  return arguments;
}

// A function for the verb and each below it. `name` is the function's.
std::string Functions(const CommandLine& line, const std::string& name) {
  std::string text = name + "() {\n";
  if (line.verbs.empty()) return text + Arguments(line) + "\n}\n";
  text += "  local context state line\n" + Arguments(line) +
          " \\\n    '1:verb:->verb' '*::argument:->argument'\n"
          "  case $state in\n  verb)\n    local -a verbs=(\n";
  std::string below;
  std::string cases;
  for (const CommandLine& verb : line.verbs) {
    const std::string function = name + "_" + verb.name;
    text += "      '" + verb.name + ":" + QuotedForZsh(verb.description) + "'\n";
    cases += "      " + verb.name + ") " + function + " ;;\n";
    below += Functions(verb, function);
  }
  return text + "    )\n    _describe verb verbs ;;\n  argument)\n    case $line[1] in\n" + cases +
         "    esac ;;\n  esac\n}\n" + below;
}

}  // namespace

std::string ZshCompletion(const CommandLine& line) {
  return "#compdef " + line.name + "\n# Completion of " + line.name + " for zsh.\n" +
         Functions(line, "_secpolicy") +
         "if [ \"$funcstack[1]\" = _secpolicy ]; then\n  _secpolicy \"$@\"\nelse\n"
         "  compdef _secpolicy secpolicy\nfi\n";
}

}  // namespace SecPolicyTool
