#include "tools/requests/questions.h"

#include <nlohmann/json.hpp>
#include <utility>

#include "host/engine/paths.h"
#include "host/root/image_index.h"
#include "tools/query/rule_json.h"

namespace SecPolicyTool {

using nlohmann::json;

AskedPolicy::AskedPolicy(Policy askedPolicy, const StandIn::HostDirectory& host)
    : policy(std::move(askedPolicy)), vocabulary(VocabularyOf(host, policy)), paths(host) {}

namespace {

// Where the policy says which label a path carries; nullptr when it carries `default`.
const LabelledFile* LabelledAt(const Policy& policy, const std::string& path) {
  const std::string archives = std::string(StandIn::kArchivesPath) + "/";
  const bool isTardisk = path.starts_with(archives);
  const auto& labelled = isTardisk ? policy.tardisks : policy.files;
  const auto found = labelled.find(isTardisk ? path.substr(archives.size()) : path);
  return found == labelled.end() ? nullptr : &found->second;
}

}  // namespace

StandIn::FileObject AskedPolicy::FileAt(const std::string& path) const {
  StandIn::FileObject file{StandIn::NormalPath(paths.Resolve(path)), std::nullopt};
  if (const LabelledFile* const labelled = LabelledAt(policy, file.path)) {
    if (!labelled->label.empty()) file.label = labelled->label;
  } else if (paths.Exists(file.path)) {
    file.label = kUnlabelled;
  }
  return file;
}

Question AskedPolicy::Parse(const std::vector<std::string>& words) const {
  return ParseQuestion(words, vocabulary, [this](const std::string& path) { return FileAt(path); });
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
  if (question.file) {
    const StandIn::FileObject& file = question.file->object;
    entry["path"] = file.path;
    entry["label"] = file.label ? json(*file.label) : json();
  }
  return entry;
}

}  // namespace

json MayJson(const PutQuestion& put, const std::string& domain, const Question& question,
             const Answer& answer) {
  json content = PutJson(put, question);
  content["domain"] = domain;
  content["allowed"] = answer.isAllowed;
  content["rule"] = RuleJson(answer.rule);
  if (question.file) content["transition"] = RuleJson(answer.transition);
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
