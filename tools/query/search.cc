#include "tools/query/search.h"

#include <algorithm>
#include <map>

#include "host/engine/domain_rules.h"
#include "host/engine/paths.h"

namespace SecPolicyTool {

namespace {

// The path rules of a domain that decide on a path, by their world.
using Deciding = std::map<StandIn::WorldId, const PolicyRule*>;

std::string PathOf(const PolicyRule& rule) { return StandIn::NormalPath(rule.key.words[0]); }

Deciding DecidingOn(const std::string& path, const DomainContent& domain) {
  std::map<StandIn::WorldId, StandIn::DomainRules> rulesOf;
  for (std::size_t number = 0; number < domain.rules.size(); ++number) {
    const PolicyRule& rule = domain.rules[number];
    if (rule.key.type != RuleType::kPath) continue;
    rulesOf[rule.key.world].Add(rule.key.type, {rule.key.words.begin(), rule.key.words.end()},
                                {false, rule.permission, number});
  }
  Deciding deciding;
  for (const auto& [world, rules] : rulesOf) {
    const StandIn::NumberedRule* const rule = rules.FindForPath(path);
    if (rule != nullptr) deciding[world] = &domain.rules[rule->number];
  }
  return deciding;
}

bool Grants(const PolicyRule& rule) {
  return InfoOf(rule.key.type).HasDecision() ? rule.isGranted : rule.permission != 0;
}

bool SpeaksOf(const PolicyRule& rule, const std::string& path, const Deciding& deciding) {
  if (rule.key.type != RuleType::kPath) return false;
  const auto best = deciding.find(rule.key.world);
  const bool isDeciding = best != deciding.end() && best->second == &rule;
  return isDeciding || StandIn::IsAtOrBelow(PathOf(rule), path);
}

bool HoldsFor(const SearchTerms& terms, const PolicyRule& rule) {
  const auto& words = rule.key.words;
  return (!terms.type || rule.key.type == *terms.type) &&
         (!terms.isGranted || Grants(rule) == *terms.isGranted) &&
         (!terms.word || std::any_of(words.begin(), words.end(), terms.word));
}

}  // namespace

std::vector<FoundRule> Search(const Policy& policy, const SearchTerms& terms) {
  std::vector<FoundRule> found;
  for (const auto& [name, domain] : policy.domains) {
    if (terms.domain && name != *terms.domain) continue;
    const Deciding deciding = terms.path ? DecidingOn(*terms.path, domain) : Deciding();
    for (const PolicyRule& rule : domain.rules) {
      if (!HoldsFor(terms, rule)) continue;
      if (terms.path && !SpeaksOf(rule, *terms.path, deciding)) continue;
      found.push_back({&name, &rule});
    }
  }
  return found;
}

TerminalText FoundText(const FoundRule& found) {
  const std::optional<Place>& place = found.rule->place;
  const bool hasFile = place && !place->file.empty();
  const std::string where = hasFile ? PlaceText(Place{place->file, place->line, 0}) : *found.domain;
  return where + ": " + LineOf(*found.rule);
}

std::optional<RuleType> TypeNamed(const std::string& name) {
  for (const RuleTypeInfo& info : kRuleTypes) {
    if (name == info.keyword || "-" + name == info.keyword || name == info.name ||
        name == info.shortName) {
      return info.type;
    }
  }
  return std::nullopt;
}

}  // namespace SecPolicyTool
