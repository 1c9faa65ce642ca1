#include "tools/check/word_judge.h"

#include <string_view>

#include "host/module/module_error.h"
#include "host/module/nearest_word.h"
#include "host/module/word_lists.h"

namespace SecPolicyTool {

using StandIn::WordList;

namespace {

// So many comparisons take less than a second.
constexpr std::size_t kMostCompared = 2'000'000;
constexpr std::size_t kShortList = 12;

std::string DidYouMean(const std::string& word) { return "did you mean \"" + word + "\"?"; }

// What the kernel calls the nearest word; empty without one.
std::string NearestIn(std::string_view refusal) {
  constexpr std::string_view kMark = " (nearest: ";
  const std::size_t at = refusal.rfind(kMark);
  if (at == std::string_view::npos || !refusal.ends_with(')')) return {};
  refusal.remove_suffix(1);
  return std::string(refusal.substr(at + kMark.size()));
}

}  // namespace

WordJudge::List& WordJudge::ListOf(WordList list) {
  const auto [entry, isNew] = lists_.try_emplace(list);
  if (isNew) {
    for (const auto& [word, id] : module_.Words(list)) {
      entry->second.refusals.emplace(word, std::nullopt);
      entry->second.words.push_back(word);
    }
  }
  return entry->second;
}

std::optional<std::string> WordJudge::Refusal(WordList list, const std::string& word,
                                              Effort effort) {
  List& known = ListOf(list);
  if (const auto found = known.refusals.find(word); found != known.refusals.end()) {
    return found->second;
  }
  if (effort == Effort::kBounded && known.looked > kMostCompared) {
    return StandIn::UnknownWordText(list, word, {});
  }
  known.looked += known.words.size();
  std::optional<std::string> refusal;
  try {
    module_.ValidateWord(list, word);
  } catch (const StandIn::ModuleError& failure) {
    refusal = failure.what();
  }
  return known.refusals.emplace(word, std::move(refusal)).first->second;
}

bool WordJudge::IsDomain(const std::string& name) {
  const auto [entry, isNew] = domains_.try_emplace(name);
  if (isNew) entry->second = module_.FindDomain(name).has_value();
  return entry->second;
}

std::string WordJudge::HelpFor(WordList list, const std::string& refusal) {
  if (const std::string nearest = NearestIn(refusal); !nearest.empty()) return DidYouMean(nearest);
  if (list == WordList::kObjects) return "define it in objects/";
  const std::vector<std::string>& words = ListOf(list).words;
  if (words.empty() || words.size() > kShortList) return {};
  std::string help = "known are:";
  for (const std::string& word : words) help += " " + word;
  return help;
}

const std::vector<std::string>& WordJudge::DomainNames() {
  if (domainNames_.empty()) {
    for (StandIn::DomainId id = 0; id < module_.MaxDomains(); ++id) {
      if (const auto info = module_.GetDomainInfo(id)) domainNames_.push_back(info->name);
    }
  }
  return domainNames_;
}

std::string WordJudge::HelpForDomain(const std::string& name) {
  if (const auto found = domainHelps_.find(name); found != domainHelps_.end()) {
    return found->second;
  }
  std::string known = "make a file domains/" + name + "; it may be empty";
  if (lookedForDomains_ > kMostCompared) return known;
  lookedForDomains_ += DomainNames().size();
  const auto nearest = StandIn::NearestWord(name, DomainNames());
  return domainHelps_.emplace(name, nearest ? DidYouMean(*nearest) : known).first->second;
}

}  // namespace SecPolicyTool
