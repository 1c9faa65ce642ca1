// What can be typed after the command's name, as data.
#pragma once

#include <CLI/CLI.hpp>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace SecPolicyTool {

struct CommandOption {
  std::vector<std::string> names;  // with their dashes; one without for a positional argument
  std::string value;  // what its value is called, "DIR" for one; empty when it takes none
  std::vector<std::string> choices;  // all values that it can have; empty when there are more
  std::string description;
  bool isRequired = false;
};

struct CommandLine {
  std::string name;
  std::string description;
  std::vector<CommandOption> options;
  std::vector<CommandOption> positionals;
  std::vector<CommandLine> verbs;
};

// What `app` accepts.
CommandLine CommandLineOf(const CLI::App& app);

// The same as JSON, for programs that make documents of it.
nlohmann::json ToJson(const CommandLine& line);

// Scripts that complete it when they are sourced by the shell.
std::string BashCompletion(const CommandLine& line);
std::string ZshCompletion(const CommandLine& line);

}  // namespace SecPolicyTool
