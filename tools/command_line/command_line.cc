#include "tools/command_line/command_line.h"

#include <charconv>
#include <nlohmann/json.hpp>
#include <utility>

#include "host/text/escaped.h"

namespace SecPolicyTool {

using nlohmann::json;

namespace {

json OptionsJson(const std::vector<CommandOption>& options) {
  json entries = json::array();
  for (const CommandOption& option : options) {
    entries.push_back({{"names", option.names},
                       {"value", option.value},
                       {"choices", option.choices},
                       {"description", option.description},
                       {"required", option.isRequired},
                       {"repeatable", option.isRepeatable}});
  }
  return entries;
}

}  // namespace

Store Into(std::string& value) {
  return [&value](const std::string& given) { value = given; };
}

Store Into(std::optional<std::string>& value) {
  return [&value](const std::string& given) { value = given; };
}

Store Into(std::vector<std::string>& values) {
  return [&values](const std::string& given) { values.push_back(given); };
}

Store Into(bool& isGiven) {
  return [&isGiven](const std::string&) { isGiven = true; };
}

Store Checked(std::string (*problem)(const std::string& value), Store store) {
  return [problem, store = std::move(store)](const std::string& given) {
    if (const std::string text = problem(given); !text.empty()) throw std::invalid_argument(text);
    store(given);
  };
}

std::int64_t WholeNumber(const std::string& text, std::int64_t least, std::int64_t most) {
  std::int64_t number = 0;
  const char* const end = text.data() + text.size();
  const auto [stop, error] = std::from_chars(text.data(), end, number);
  if (error != std::errc() || stop != end || number < least || number > most) {
    throw std::invalid_argument("\"" + StandIn::Escaped(text).Text() +
                                "\" is not a whole number from " + std::to_string(least) + " to " +
                                std::to_string(most));
  }
  return number;
}

std::vector<CommandOption> AllOptions(const CommandLine& line) {
  std::vector<CommandOption> options{
      {.names = {"-h", "--help"}, .description = "Print this help message and exit", .store = {}}};
  if (!line.version.empty()) {
    options.push_back({.names = {"--version"},
                       .description = "Display program version information and exit",
                       .store = {}});
  }
  options.insert(options.end(), line.options.begin(), line.options.end());
  return options;
}

json ToJson(const CommandLine& line) {
  json verbs = json::array();
  for (const CommandLine& verb : line.verbs) verbs.push_back(ToJson(verb));
  return {{"name", line.name},
          {"description", line.description},
          {"options", OptionsJson(AllOptions(line))},
          {"positionals", OptionsJson(line.operands)},
          {"verbs", std::move(verbs)}};
}

}  // namespace SecPolicyTool
