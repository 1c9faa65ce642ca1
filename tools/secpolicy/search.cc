// secpolicy search [--host DIR] [--json] SOURCE [terms]
#include <iostream>
#include <memory>

#include "tools/policy/output.h"
#include "tools/query/bad_request.h"
#include "tools/requests/search_request.h"
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
  SearchRequest request;
};

SearchRequest RequestOf(const SearchArguments& arguments) {
  SearchRequest request = arguments.request;
  if (arguments.isRegex) request.wordIs = SearchRequest::Word::kRegex;
  if (arguments.isGranted || arguments.isRevoked) request.isGranted = arguments.isGranted;
  return request;
}

// A pattern that is none is wrong usage, and told before a policy is read.
void RequireTerms(const SearchRequest& request, const HostPaths& paths) try {
  TermsOf(request, paths);
} catch (const BadRequest& problem) {
  throw CLI::ValidationError("--word", problem.what());
}

ExitStatus PrintFound(const SearchArguments& arguments) {
  const SearchRequest request = RequestOf(arguments);
  const HostPaths paths(OpenHost(arguments.host));
  RequireTerms(request, paths);
  const Policy policy = ReadPolicy(arguments.host, arguments.source, OnErrors::kWarn);
  const std::vector<FoundRule> found = Find(policy, request, paths);
  if (arguments.isJson) {
    PrintJson(SearchJson(arguments.source, found));
  } else {
    for (const FoundRule& each : found) std::cout << FoundText(each) << "\n";
  }
  return found.empty() ? kFailed : kDone;
}

}  // namespace

void AddSearch(CLI::App& app, ExitStatus& status) {
  CLI::App* verb = app.add_subcommand("search", "Find rules of a policy");
  verb->footer("Exit status: 0 found, 1 nothing found, or an error was reported, 2 wrong usage.");
  const auto arguments = std::make_shared<SearchArguments>();
  AddHostOption(*verb, arguments->host);
  AddJsonOption(*verb, arguments->isJson);
  AddSourceOption(*verb, arguments->source);
  verb->add_option("--domain", arguments->request.domain, "Rules of this domain")
      ->type_name("NAME");
  verb->add_option("--type", arguments->request.type, "Rules of this type, such as -s or syscall")
      ->type_name("TYPE")
      ->check(TypeProblem);
  CLI::Option* word = verb->add_option("--word", arguments->request.word, "Rules with this word")
                          ->type_name("WORD");
  verb->add_flag("--regex", arguments->isRegex, "The word is a regular expression (ECMAScript)")
      ->needs(word);
  verb->add_option("--path", arguments->request.path,
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
