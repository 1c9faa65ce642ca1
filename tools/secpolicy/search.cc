// secpolicy search [--host DIR] [--json] SOURCE [terms]
#include "tools/query/search.h"

#include <iostream>
#include <memory>
#include <regex>

#include "tools/policy/output.h"
#include "tools/policy/terminal.h"
#include "tools/query/host_paths.h"
#include "tools/query/paths.h"
#include "tools/query/rule_json.h"
#include "tools/query/vocabulary.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/source_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct SearchArguments {
  std::string host;
  std::string source;
  bool isJson = false;
  bool isRegex = false;
  bool isGranted = false;
  bool isRevoked = false;
  std::optional<std::string> domain;
  std::optional<std::string> type;
  std::optional<std::string> word;
  std::optional<std::string> path;
};

std::regex RegexOf(const std::string& text) try {
  return std::regex(text, std::regex::ECMAScript);
} catch (const std::regex_error& problem) {
  throw CLI::ValidationError(
      "--word", "\"" + Printable(text) + "\" is no regular expression: " + problem.what());
}

SearchTerms TermsOf(const SearchArguments& arguments) {
  SearchTerms terms;
  terms.domain = arguments.domain;
  if (arguments.type) terms.type = TypeNamed(*arguments.type);
  terms.path = arguments.path;
  if (arguments.isGranted || arguments.isRevoked) terms.isGranted = arguments.isGranted;
  if (arguments.word && arguments.isRegex) {
    terms.word = [regex = RegexOf(*arguments.word)](const std::string& word) {
      return std::regex_search(word, regex);
    };
  } else if (arguments.word) {
    terms.word = [wanted = *arguments.word](const std::string& word) { return word == wanted; };
  }
  return terms;
}

nlohmann::json FoundJson(const std::vector<FoundRule>& found) {
  nlohmann::json entries = nlohmann::json::array();
  for (const FoundRule& each : found) {
    entries.push_back({{"domain", *each.domain}, {"rule", RuleJson(*each.rule)}});
  }
  return entries;
}

ExitStatus PrintFound(const SearchArguments& arguments) {
  SearchTerms terms = TermsOf(arguments);
  const Policy policy = ReadPolicy(arguments.host, arguments.source, OnErrors::kWarn);
  if (terms.domain) DomainOf(policy, *terms.domain);
  if (terms.path) {
    terms.path = NormalPath(HostPaths(OpenHost(arguments.host)).Resolve(*terms.path));
  }
  const std::vector<FoundRule> found = Search(policy, terms);
  if (arguments.isJson) {
    PrintJson({{"source", arguments.source}, {"matches", FoundJson(found)}});
  } else {
    for (const FoundRule& each : found) std::cout << FoundText(each) << "\n";
  }
  return found.empty() ? kFailed : kDone;
}

// For CLI11: what is wrong with the value of an option, or nothing.
std::string TypeProblem(const std::string& name) {
  return TypeNamed(name) ? "" : "no type of rules is called \"" + Printable(name) + "\"";
}

std::string PathProblem(const std::string& path) {
  return path.starts_with('/') ? "" : "not an absolute path: \"" + Printable(path) + "\"";
}

}  // namespace

void AddSearch(CLI::App& app, ExitStatus& status) {
  CLI::App* verb = app.add_subcommand("search", "Find rules of a policy");
  verb->footer("Exit status: 0 found, 1 nothing found, or an error was reported, 2 wrong usage.");
  const auto arguments = std::make_shared<SearchArguments>();
  AddHostOption(*verb, arguments->host);
  AddJsonOption(*verb, arguments->isJson);
  AddSourceOption(*verb, arguments->source);
  verb->add_option("--domain", arguments->domain, "Rules of this domain")->type_name("NAME");
  verb->add_option("--type", arguments->type, "Rules of this type, such as -s or syscall")
      ->type_name("TYPE")
      ->check(TypeProblem);
  CLI::Option* word =
      verb->add_option("--word", arguments->word, "Rules with this word")->type_name("WORD");
  verb->add_flag("--regex", arguments->isRegex, "The word is a regular expression (ECMAScript)")
      ->needs(word);
  verb->add_option("--path", arguments->path,
                   "Path rules that decide on this path, or are for something below it")
      ->type_name("PATH")
      ->check(PathProblem);
  CLI::Option* granted =
      verb->add_flag("--granted", arguments->isGranted, "Rules that grant, or permit something");
  verb->add_flag("--revoked", arguments->isRevoked, "Rules that revoke, or permit nothing")
      ->excludes(granted);
  verb->callback([arguments, &status] { status = PrintFound(*arguments); });
}

}  // namespace SecPolicyTool
