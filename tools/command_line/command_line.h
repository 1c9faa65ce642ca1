// The command line as data: the parser, the help, the completion scripts and the manual pages all
// read this description.
#pragma once

#include <cstdint>
#include <functional>
#include <nlohmann/json_fwd.hpp>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "tools/policy/exit_status.h"

namespace SecPolicyTool {

// The command line cannot be used as it is. Reported with a hint at --help and status kUsage.
class UsageError : public std::runtime_error {
 public:
  // `subject` is the option or operand with the problem.
  UsageError(const std::string& subject, const std::string& problem)
      : std::runtime_error(problem), subject_(subject) {}

  [[nodiscard]] const std::string& Subject() const { return subject_; }

 private:
  std::string subject_;
};

// Stores a value of an option or operand; a flag's is empty. Throws std::invalid_argument with what
// is wrong with the value, which becomes a UsageError.
using Store = std::function<void(const std::string& value)>;

// One option or operand.
struct CommandOption {
  std::vector<std::string> names;  // with their dashes; an operand has one name, without
  std::string value{};             // what its value is called, "DIR" for one; empty for a flag
  std::string description;
  Store store;
  std::vector<std::string> choices{};  // the values that it can have; empty when any will do
  std::string defaultValue{};          // shown in the help; what `store` was not called with
  std::string excludes{};              // an option of the same verb that this one contradicts
  std::string needs{};  // an option of the same verb that this one is useless without
  bool isRequired = false;
  bool isRepeatable = false;  // an option may be given again; an operand takes all words left
};

// The command, or a verb of it.
struct CommandLine {
  std::string name;
  std::string description;
  std::string footer{};   // printed below the help; the outer one's when it is empty
  std::string version{};  // printed for --version; without it there is no such option
  std::vector<CommandOption> options{};
  std::vector<CommandOption> operands{};
  // Either verbs, one of which has to be chosen, or what is done.
  std::vector<CommandLine> verbs{};
  std::function<ExitStatus()> run{};
};

// Stores that keep the value in a variable, which has to live as long as the description.
Store Into(std::string& value);
Store Into(std::optional<std::string>& value);
Store Into(std::vector<std::string>& values);  // adds to them
Store Into(bool& isGiven);

// Keeps what `problem` finds nothing wrong with; its text is what is wrong, empty for nothing.
Store Checked(std::string (*problem)(const std::string& value), Store store);

// The decimal number `text`. Throws std::invalid_argument `"TEXT" is not a whole number from LEAST
// to MOST`.
std::int64_t WholeNumber(const std::string& text, std::int64_t least, std::int64_t most);

// The options of `line` and those that every command line has: --help, and --version where it has
// one.
std::vector<CommandOption> AllOptions(const CommandLine& line);

// Parses the arguments, stores them and runs the verb that they choose; its status comes back. Help
// and version are printed on standard output; wrong usage is reported on standard error, before or
// instead of the verb's work. What the verb throws, other than UsageError, is handed on.
ExitStatus RunCommandLine(const CommandLine& line, int argc, const char* const* argv);

// The description as JSON, for programs that make documents of it (docs/schemas).
nlohmann::json ToJson(const CommandLine& line);

// Scripts that complete the command line when they are sourced by the shell.
std::string BashCompletion(const CommandLine& line);
std::string ZshCompletion(const CommandLine& line);

}  // namespace SecPolicyTool
