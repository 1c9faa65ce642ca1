#include "tools/requests/questions.h"

#include <nlohmann/json.hpp>
#include <utility>

#include "tools/query/rule_json.h"

namespace SecPolicyTool {

using nlohmann::json;

AskedPolicy::AskedPolicy(Policy askedPolicy, const StandIn::HostDirectory& host)
    : policy(std::move(askedPolicy)), vocabulary(VocabularyOf(host, policy)), paths(host) {}

Question AskedPolicy::Parse(const std::vector<std::string>& words) const {
  return ParseQuestion(words, vocabulary,
                       [this](const std::string& path) { return paths.Resolve(path); });
}

std::vector<AllowedDomain> AllowedBy(const Policy& policy, const Question& question) {
  std::vector<AllowedDomain> allowed;
  for (const auto& [name, domain] : policy.domains) {
    const Answer answer = DomainDecisions(domain).Decide(question);
    if (answer.isAllowed) allowed.push_back({name, answer.rule});
  }
  return allowed;
}

namespace {

// What was asked.
json PutJson(const PutQuestion& put, const Question& question) {
  json entry{{"policy", put.source},
             {"operation", put.words.front()},
             {"objects", std::vector<std::string>(put.words.begin() + 1, put.words.end())},
             {"type", InfoOf(question.key.type).keyword}};
  if (question.key.type == RuleType::kPath) entry["path"] = question.key.words[0];
  return entry;
}

}  // namespace

json MayJson(const PutQuestion& put, const std::string& domain, const Question& question,
             const Answer& answer) {
  json content = PutJson(put, question);
  content["domain"] = domain;
  content["allowed"] = answer.isAllowed;
  content["rule"] = RuleJson(answer.rule);
  return content;
}

json WhoJson(const PutQuestion& put, const Question& question,
             const std::vector<AllowedDomain>& allowed) {
  json content = PutJson(put, question);
  content["domains"] = json::array();
  for (const AllowedDomain& each : allowed) {
    content["domains"].push_back({{"domain", each.name}, {"rule", RuleJson(each.rule)}});
  }
  return content;
}

}  // namespace SecPolicyTool
