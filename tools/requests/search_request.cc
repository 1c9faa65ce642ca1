#include "tools/requests/search_request.h"

#include <re2/re2.h>

#include <memory>
#include <nlohmann/json.hpp>

#include "host/engine/paths.h"
#include "host/text/escaped.h"
#include "tools/query/bad_request.h"
#include "tools/query/rule_json.h"
#include "tools/query/vocabulary.h"

namespace SecPolicyTool {

using nlohmann::json;
using StandIn::Escaped;

namespace {

// Bounds of what a pattern may take; a match takes time in proportion to the word's length.
constexpr std::size_t kLongestPattern = 1000;     // bytes
constexpr std::int64_t kPatternMemory = 4 << 20;  // bytes, for all that is made of it

// RE2 cannot be copied, and functions are.
std::shared_ptr<const RE2> RegexOf(const std::string& text) {
  if (text.size() > kLongestPattern) {
    throw BadRequest("the regular expression has " + std::to_string(text.size()) +
                     " bytes, and at most " + std::to_string(kLongestPattern) + " are allowed");
  }
  RE2::Options options(RE2::Quiet);
  options.set_max_mem(kPatternMemory);
  auto regex = std::make_shared<const RE2>(text, options);
  if (!regex->ok()) {
    throw BadRequest("\"" + Escaped(text).Text() +
                     "\" is no regular expression: " + Escaped(regex->error()).Text());
  }
  return regex;
}

std::function<bool(const std::string&)> WordTerm(const SearchRequest& request) {
  if (!request.word) return {};
  if (request.wordIs == SearchRequest::Word::kExact) {
    return [wanted = *request.word](const std::string& word) { return word == wanted; };
  }
  return [regex = RegexOf(*request.word)](const std::string& word) {
    return RE2::PartialMatch(word, *regex);
  };
}

void Require(const std::string& problem) {
  if (!problem.empty()) throw BadRequest(problem);
}

}  // namespace

std::string TypeProblem(const std::string& name) {
  return TypeNamed(name) ? "" : "no type of rules is called \"" + Escaped(name).Text() + "\"";
}

std::string PathProblem(const std::string& path) {
  return path.starts_with('/') ? "" : "not an absolute path: \"" + Escaped(path).Text() + "\"";
}

SearchTerms TermsOf(const SearchRequest& request, const HostPaths& paths) {
  if (request.type) Require(TypeProblem(*request.type));
  if (request.path) Require(PathProblem(*request.path));
  SearchTerms terms;
  terms.domain = request.domain;
  if (request.type) terms.type = TypeNamed(*request.type);
  terms.word = WordTerm(request);
  if (request.path) terms.path = StandIn::NormalPath(paths.Resolve(*request.path));
  terms.isGranted = request.isGranted;
  return terms;
}

std::vector<FoundRule> Find(const Policy& policy, const SearchRequest& request,
                            const HostPaths& paths) {
  const SearchTerms terms = TermsOf(request, paths);
  if (terms.domain) DomainOf(policy, *terms.domain);
  return Search(policy, terms);
}

json SearchJson(const std::string& source, const std::vector<FoundRule>& found) {
  json matches = json::array();
  for (const FoundRule& each : found) {
    matches.push_back({{"domain", *each.domain}, {"rule", RuleJson(*each.rule)}});
  }
  return {{"source", source}, {"matches", std::move(matches)}};
}

}  // namespace SecPolicyTool
