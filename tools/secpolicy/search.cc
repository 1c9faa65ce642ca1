// secpolicy search [--host DIR] [--json] SOURCE [terms]
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>

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
  throw UsageError("--word", problem.what());
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
    for (const FoundRule& each : found) std::cout << FoundText(each).EndLine();
  }
  return found.empty() ? kFailed : kDone;
}

}  // namespace

CommandLine SearchVerb() {
  const auto arguments = std::make_shared<SearchArguments>();
  SearchRequest& request = arguments->request;
  return {
      .name = "search",
      .description = "Find rules of a policy",
      .footer = "Exit status: 0 found, 1 nothing found, or an error was reported, 2 wrong usage.",
      .options = {HostOption(arguments->host),
                  JsonOption(arguments->isJson),
                  {.names = {"--domain"},
                   .value = "NAME",
                   .description = "Rules of this domain",
                   .store = Into(request.domain)},
                  {.names = {"--type"},
                   .value = "TYPE",
                   .description = "Rules of this type, such as -s or syscall",
                   .store = Checked(TypeProblem, Into(request.type))},
                  {.names = {"--word"},
                   .value = "WORD",
                   .description = "Rules with this word",
                   .store = Into(request.word)},
                  {.names = {"--regex"},
                   .description = "The word is a regular expression (RE2 syntax)",
                   .store = Into(arguments->isRegex),
                   .needs = "--word"},
                  {.names = {"--path"},
                   .value = "PATH",
                   .description =
                       "Path rules that decide on this path, or are for something below it",
                   .store = Checked(PathProblem, Into(request.path))},
                  {.names = {"--granted"},
                   .description = "Rules that grant, or permit something",
                   .store = Into(arguments->isGranted)},
                  {.names = {"--revoked"},
                   .description = "Rules that revoke, or permit nothing",
                   .store = Into(arguments->isRevoked),
                   .excludes = "--granted"}},
      .operands = {SourceOperand(arguments->source)},
      .run = [arguments] { return PrintFound(*arguments); }};
}

}  // namespace SecPolicyTool
