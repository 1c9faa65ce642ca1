#include "tools/query/difference.h"

#include <algorithm>
#include <map>
#include <utility>

namespace SecPolicyTool {

namespace {

// Hands `differ` the name of each entry that is not the same in both maps, its two contents,
// nullptr for one that is not there, and the later one of those that are.
template <typename Map, typename Same, typename Differ>
void ForEachDifference(const Map& before, const Map& after, const Same& same,
                       const Differ& differ) {
  auto old = before.begin();
  auto now = after.begin();
  while (old != before.end() || now != after.end()) {
    if (now == after.end() || (old != before.end() && old->first < now->first)) {
      differ(old->first, &old->second, nullptr, old->second);
      ++old;
    } else if (old == before.end() || now->first < old->first) {
      differ(now->first, nullptr, &now->second, now->second);
      ++now;
    } else {
      if (!same(old->second, now->second)) {
        differ(old->first, &old->second, &now->second, now->second);
      }
      ++old;
      ++now;
    }
  }
}

template <typename Content>
std::optional<Content> Copied(const Content* content) {
  return content == nullptr ? std::nullopt : std::optional<Content>(*content);
}

template <typename Content, typename Same>
std::vector<Named<Content>> CompareNamed(const std::map<std::string, Content>& before,
                                         const std::map<std::string, Content>& after,
                                         const Same& same) {
  std::vector<Named<Content>> changes;
  ForEachDifference(
      before, after, same,
      [&](const std::string& name, const Content* old, const Content* now, const Content&) {
        changes.push_back({name, {Copied(old), Copied(now)}});
      });
  return changes;
}

// ---- Rules ----

using RulesByKey = std::map<RuleKey, PolicyRule>;

RulesByKey ByKey(const DomainContent* domain) {
  RulesByKey rules;
  if (domain == nullptr) return rules;
  for (const PolicyRule& rule : domain->rules) rules[rule.key] = rule;
  return rules;
}

// The granted transitions of one label and event that are gone, and those that are new.
struct Retargeting {
  std::vector<std::size_t> removed;
  std::vector<std::size_t> added;
};

// Makes a change of the removal and the addition of a transition that only has another target now.
void JoinRetargeted(std::vector<ChangedRule>& changes) {
  std::map<std::pair<std::string, std::string>, Retargeting> retargeted;
  for (std::size_t i = 0; i < changes.size(); ++i) {
    const PolicyRule& rule = changes[i].Latest();
    if (rule.key.type != RuleType::kTransition || !rule.isGranted) continue;
    Retargeting& entry = retargeted[{rule.key.words[0], rule.key.words[2]}];
    if (changes[i].Kind() == Change::kRemoved) entry.removed.push_back(i);
    if (changes[i].Kind() == Change::kAdded) entry.added.push_back(i);
  }
  for (const auto& [event, entry] : retargeted) {
    if (entry.removed.size() != 1 || entry.added.size() != 1) continue;
    changes[entry.removed[0]].after = std::move(changes[entry.added[0]].after);
    changes[entry.added[0]].after.reset();
  }
  std::erase_if(changes, [](const ChangedRule& change) { return !change.before && !change.after; });
}

std::vector<ChangedRule> CompareRules(const DomainContent* before, const DomainContent* after) {
  std::vector<ChangedRule> changes;
  ForEachDifference(
      ByKey(before), ByKey(after),
      [](const PolicyRule& old, const PolicyRule& now) { return old.Means(now); },
      [&](const RuleKey&, const PolicyRule* old, const PolicyRule* now, const PolicyRule&) {
        changes.push_back({Copied(old), Copied(now)});
      });
  JoinRetargeted(changes);
  return changes;
}

std::vector<ChangedDomain> CompareDomains(const Policy& before, const Policy& after) {
  std::vector<ChangedDomain> changes;
  ForEachDifference(
      before.domains, after.domains,
      [](const DomainContent&, const DomainContent&) { return false; },
      [&](const std::string& name, const DomainContent* old, const DomainContent* now,
          const DomainContent& latest) {
        const Change kind = now == nullptr   ? Change::kRemoved
                            : old == nullptr ? Change::kAdded
                                             : Change::kChanged;
        ChangedDomain change{name, kind, latest.place, CompareRules(old, now)};
        if (kind != Change::kChanged || !change.rules.empty()) changes.push_back(std::move(change));
      });
  return changes;
}

std::vector<Named<ObjectContent>> CompareObjects(const Policy& before, const Policy& after) {
  auto changes = CompareNamed(before.objects, after.objects,
                              [](const ObjectContent&, const ObjectContent&) { return true; });
  std::erase_if(changes, [](const auto& entry) { return entry.change.Latest().isPredefined; });
  return changes;
}

bool SameLabel(const LabelledFile& old, const LabelledFile& now) { return old.label == now.label; }

}  // namespace

Difference Compare(const Policy& before, const Policy& after) {
  return {CompareDomains(before, after), CompareObjects(before, after),
          CompareNamed(before.tardisks, after.tardisks, SameLabel),
          CompareNamed(before.files, after.files, SameLabel)};
}

}  // namespace SecPolicyTool
