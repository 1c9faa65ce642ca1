#include "tools/query/vocabulary.h"

#include <stdexcept>

#include "host/module/description_json.h"
#include "tools/policy/unknown_word.h"
#include "tools/query/bad_request.h"

namespace SecPolicyTool {

namespace {

template <typename Content>
std::vector<std::string> NamesOf(const std::map<std::string, Content>& entries) {
  std::vector<std::string> names;
  names.reserve(entries.size());
  for (const auto& [name, content] : entries) names.push_back(name);
  return names;
}

}  // namespace

Vocabulary VocabularyOf(const StandIn::HostDirectory& host, const Policy& policy) {
  Vocabulary words;
  words.lists =
      StandIn::ReadDescription(host.DescriptionText(), host.Ref().PathOf(StandIn::kDescriptionFile))
          .words;
  words.lists[StandIn::WordList::kObjects] = NamesOf(policy.objects);
  words.domains = NamesOf(policy.domains);
  return words;
}

const DomainContent& DomainOf(const Policy& policy, const std::string& name) {
  const auto domain = policy.domains.find(name);
  if (domain != policy.domains.end()) return domain->second;
  throw BadRequest(UnknownWordText("domain", name, NamesOf(policy.domains)));
}

}  // namespace SecPolicyTool
