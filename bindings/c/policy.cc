// Policies as they were read, and questions to them.
#include <memory>
#include <nlohmann/json.hpp>
#include <utility>

#include "bindings/c/text.h"
#include "host/text/utf8_text.h"
#include "tools/policy/policy_source.h"
#include "tools/requests/questions.h"
#include "tools/requests/search_request.h"

using nlohmann::json;
using SecPolicyC::AnswerWithText;
using SecPolicyC::Failure;
using SecPolicyC::OptionalTextOf;
using SecPolicyC::RequireSet;
using SecPolicyC::TextOf;
using SecPolicyC::WordsOf;
using SecPolicyTool::AskedPolicy;
using SecPolicyTool::Question;
using SecPolicyTool::SearchRequest;
using StandIn::HostDirectory;

namespace {

std::optional<bool> IsGrantedOf(secpolicy_decision decision) {
  switch (decision) {
    case SECPOLICY_ANY_DECISION:
      return std::nullopt;
    case SECPOLICY_GRANTED:
      return true;
    case SECPOLICY_REVOKED:
      return false;
    case SECPOLICY_DECISION_RANGE:
      break;
  }
  throw Failure(SECPOLICY_INVALID_ARGUMENT, "terms->decision is none");
}

SearchRequest RequestOf(const secpolicy_search_terms* terms) {
  RequireSet(terms, "terms");
  if (terms->size != sizeof *terms) {
    throw Failure(SECPOLICY_INVALID_ARGUMENT, "terms->size is not that of secpolicy_search_terms");
  }
  if (terms->word != nullptr && terms->pattern != nullptr) {
    throw Failure(SECPOLICY_INVALID_ARGUMENT, "terms have both a word and a pattern");
  }
  SearchRequest request;
  request.domain = OptionalTextOf(terms->domain, "terms->domain");
  request.type = OptionalTextOf(terms->type, "terms->type");
  request.word = OptionalTextOf(terms->word, "terms->word");
  request.path = OptionalTextOf(terms->path, "terms->path");
  request.isGranted = IsGrantedOf(terms->decision);
  if (terms->pattern != nullptr) {
    request.word = TextOf(terms->pattern, "terms->pattern");
    request.wordIs = SearchRequest::Word::kRegex;
  }
  return request;
}

AskedPolicy Asked(const secpolicy_policy& policy) {
  return {policy.content, HostDirectory(policy.host)};
}

json SearchIn(const secpolicy_policy& policy, const SearchRequest& request) {
  const SecPolicyTool::HostPaths paths{HostDirectory(policy.host)};
  return SecPolicyTool::SearchJson(policy.source,
                                   SecPolicyTool::Find(policy.content, request, paths));
}

json AskMay(const secpolicy_policy& policy, const std::string& domain,
            const std::vector<std::string>& words) {
  SecPolicyTool::CheckForm(words);
  const AskedPolicy asked = Asked(policy);
  const SecPolicyTool::DomainDecisions decisions(SecPolicyTool::DomainOf(asked.policy, domain));
  const Question question = asked.Parse(words);
  return SecPolicyTool::MayJson({policy.source, words}, domain, question,
                                decisions.Decide(question));
}

json AskWho(const secpolicy_policy& policy, const std::vector<std::string>& words) {
  SecPolicyTool::CheckForm(words);
  const AskedPolicy asked = Asked(policy);
  const Question question = asked.Parse(words);
  return SecPolicyTool::WhoJson({policy.source, words}, question,
                                SecPolicyTool::AllowedBy(asked.policy, question));
}

}  // namespace

extern "C" {

secpolicy_status secpolicy_policy_read(const secpolicy_host* host, const char* source,
                                       secpolicy_policy** policy, secpolicy_error** error) {
  if (policy != nullptr) *policy = nullptr;
  return SecPolicyC::Guarded(error, [&] {
    RequireSet(host, "host");
    RequireSet(policy, "policy");
    auto read = std::make_unique<secpolicy_policy>();
    read->host = host->path;
    read->source = SecPolicyC::PolicyDirOf(source, "source");
    SecPolicyTool::SourcePolicy found =
        SecPolicyTool::ReadSource(HostDirectory(read->host), read->source);
    read->content = std::move(found.policy);
    for (const std::string& each : found.errors) {
      read->errors.push_back(StandIn::ValidText(each));
    }
    *policy = read.release();
  });
}

size_t secpolicy_policy_error_count(const secpolicy_policy* policy) {
  return policy == nullptr ? 0 : policy->errors.size();
}

const char* secpolicy_policy_error(const secpolicy_policy* policy, size_t index) {
  if (index >= secpolicy_policy_error_count(policy)) return nullptr;
  return policy->errors[index].c_str();
}

void secpolicy_policy_free(secpolicy_policy* policy) { delete policy; }

secpolicy_status secpolicy_search(const secpolicy_policy* policy,
                                  const secpolicy_search_terms* terms, secpolicy_text** result,
                                  secpolicy_error** error) {
  return AnswerWithText(result, error, [&] {
    RequireSet(policy, "policy");
    return [policy, request = RequestOf(terms)] { return SearchIn(*policy, request); };
  });
}

secpolicy_status secpolicy_may(const secpolicy_policy* policy, const char* domain,
                               const char* const* words, size_t count, secpolicy_text** result,
                               secpolicy_error** error) {
  return AnswerWithText(result, error, [&] {
    RequireSet(policy, "policy");
    return [policy, name = TextOf(domain, "domain"), asked = WordsOf(words, count)] {
      return AskMay(*policy, name, asked);
    };
  });
}

secpolicy_status secpolicy_who(const secpolicy_policy* policy, const char* const* words,
                               size_t count, secpolicy_text** result, secpolicy_error** error) {
  return AnswerWithText(result, error, [&] {
    RequireSet(policy, "policy");
    return [policy, asked = WordsOf(words, count)] { return AskWho(*policy, asked); };
  });
}

}  // extern "C"
