// A search as its user says it.
#pragma once

#include <cstdint>
#include <nlohmann/json_fwd.hpp>
#include <optional>
#include <string>
#include <vector>

#include "tools/query/host_paths.h"
#include "tools/query/search.h"

namespace SecPolicyTool {

// What is looked for; what is not given does not matter.
struct SearchRequest {
  std::optional<std::string> domain;
  std::optional<std::string> type;  // see TypeNamed
  std::optional<std::string> word;
  // kRegex: a word that holds a match of this regular expression, in the syntax of RE2.
  enum class Word : std::uint8_t { kExact, kRegex } wordIs = Word::kExact;
  std::optional<std::string> path;  // within the host; its links are followed
  std::optional<bool> isGranted;
};

// What is wrong with the name of a type, or with a path, as such; empty when nothing is.
std::string TypeProblem(const std::string& name);
std::string PathProblem(const std::string& path);

// The terms that `request` means on a host with these paths. Throws BadRequest: TypeProblem,
// PathProblem, `"WORD" is no regular expression: REASON`, also for one that would take more than
// 4 MiB, and "the regular expression has N bytes, and at most 1000 are allowed".
SearchTerms TermsOf(const SearchRequest& request, const HostPaths& paths);

// The rules of `policy` that `request` is for; they live as long as the policy. Throws as TermsOf
// and DomainOf.
std::vector<FoundRule> Find(const Policy& policy, const SearchRequest& request,
                            const HostPaths& paths);

// docs/schemas/search.schema.json. `source` is the policy's as given.
nlohmann::json SearchJson(const std::string& source, const std::vector<FoundRule>& found);

}  // namespace SecPolicyTool
