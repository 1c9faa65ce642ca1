// Lines of the seven rule types that end in a decision.
#include <algorithm>

#include "tests/corpus/corpus.h"
#include "tests/corpus/line_parts.h"
#include "tests/corpus/rule_types.h"

namespace SecPolicyTest {

namespace {

Words LineOf(const CorpusRuleType& type, Words words, const std::string& decision) {
  words.insert(words.begin(), type.keyword);
  words.push_back(decision);
  return words;
}

std::string RecordOf(const CorpusRuleType& type, const Words& words, const std::string& decision) {
  std::string record = kLine + " " + type.keyword;
  for (std::size_t i = 0; i < words.size(); ++i) {
    record += "|" + words[i];
    if (type.places[i].judge != Judge::kDomains) continue;
    const auto domain = std::find(kCorpusDomains.begin(), kCorpusDomains.end(), words[i]);
    record += "=" + std::to_string(domain - kCorpusDomains.begin());
  }
  return record + "|" + decision;
}

// Every accepted word in every place, with every other.
void AddGood(const CorpusRuleType& type, const Words& sofar, std::vector<CorpusLine>& lines) {
  if (sofar.size() == type.places.size()) {
    for (const std::string decision : {"grant", "revoke"}) {
      lines.push_back({LineOf(type, sofar, decision), "", RecordOf(type, sofar, decision), false});
    }
    return;
  }
  for (const std::string& word : type.places[sofar.size()].table.words) {
    Words longer = sofar;
    longer.push_back(word);
    AddGood(type, longer, lines);
  }
}

// Good words, different ones for different `turn`s.
Words GoodWords(const CorpusRuleType& type, std::size_t turn) {
  Words words;
  for (const CorpusPlace& place : type.places) {
    words.push_back(place.table.words[turn * 7 % place.table.words.size()]);
  }
  return words;
}

// Every number of words but the right one, with good words and with bad ones: nothing else is
// looked at.
void AddWrongCounts(const CorpusRuleType& type, std::vector<CorpusLine>& lines) {
  const std::size_t right = type.places.size() + 1;
  for (std::size_t count = 0; count <= right + 4; ++count) {
    if (count == right) continue;
    for (std::size_t turn = 0; turn < 4; ++turn) {
      Words words{type.keyword};
      const Words good = GoodWords(type, turn);
      for (std::size_t i = 0; i < count; ++i) {
        const bool isLast = i + 1 == count;
        words.push_back(turn == 3 ? "bad" : isLast ? "grant" : good[i % good.size()]);
      }
      lines.push_back({words, kInDomain + kWrongCount, "", true});
    }
  }
}

// What a line with these words is refused with, by the order in which they are looked at: a target
// domain, the decision, then the words from left to right.
std::string CauseOf(const CorpusRuleType& type, const Words& words, const std::string& decision) {
  const auto isIn = [](const Words& list, const std::string& word) {
    return std::find(list.begin(), list.end(), word) != list.end();
  };
  for (std::size_t i = 0; i < words.size(); ++i) {
    const bool isTarget = type.places[i].judge == Judge::kDomains;
    if (isTarget && !isIn(kCorpusDomains, words[i])) {
      return "Failed to fetch domain id for: " + words[i];
    }
  }
  if (!isIn({"grant", "revoke"}, decision)) return "invalid keyword " + decision;
  for (std::size_t i = 0; i < words.size(); ++i) {
    const CorpusPlace& place = type.places[i];
    if (place.judge == Judge::kTable && !isIn(place.table.words, words[i])) {
      return UnknownWord(place.table, words[i]);
    }
  }
  return "";
}

void AddBad(const CorpusRuleType& type, const Words& words, const std::string& decision,
            std::vector<CorpusLine>& lines) {
  const std::string cause = CauseOf(type, words, decision);
  lines.push_back({LineOf(type, words, decision), kInDomain + cause, "", true});
}

const Words kBadDecisions{"Grant",    "GRANT",   "gRANT",        "grants", "gran",      "grant\t",
                          "\tgrant",  "grant\r", "revoke\r",     "Revoke", "revoked",   "REVOKE",
                          "allow",    "deny",    "yes",          "1",      "\"grant\"", "grant,",
                          "revoke\t", "-",       "grant\xc2\xa0"};

// Wrong decisions, behind good words and behind ever more bad ones.
void AddBadDecisions(const CorpusRuleType& type, std::vector<CorpusLine>& lines) {
  for (std::size_t turn = 0; turn < kBadDecisions.size(); ++turn) {
    Words words = GoodWords(type, turn);
    AddBad(type, words, kBadDecisions[turn], lines);
    for (std::string& word : words) {
      word = "bad";
      AddBad(type, words, kBadDecisions[turn], lines);
    }
  }
}

// Each bad word in each place that is judged: alone, with everything behind it bad as well, and
// with a wrong decision.
void AddBadWords(const CorpusRuleType& type, std::vector<CorpusLine>& lines) {
  constexpr std::size_t kWords = 6;
  for (std::size_t i = 0; i < type.places.size(); ++i) {
    const CorpusPlace& place = type.places[i];
    if (place.judge == Judge::kNobody) continue;
    std::size_t turn = 0;
    for (const std::string& good : Some(place.table, kWords)) {
      for (const std::string& bad : Misspelt(place.table, good)) {
        Words words = GoodWords(type, ++turn);
        words[i] = bad;
        AddBad(type, words, turn % 2 == 0 ? "grant" : "revoke", lines);
        AddBad(type, words, kBadDecisions[turn % kBadDecisions.size()], lines);
        if (i + 1 == words.size()) continue;
        std::fill(words.begin() + static_cast<std::ptrdiff_t>(i) + 1, words.end(), "worse");
        AddBad(type, words, "grant", lines);
      }
    }
  }
}

}  // namespace

std::vector<CorpusLine> KeywordLines(const std::string& keyword) {
  const CorpusRuleType type = TypeOf(keyword);
  std::vector<CorpusLine> lines;
  AddGood(type, {}, lines);
  AddWrongCounts(type, lines);
  AddBadDecisions(type, lines);
  AddBadWords(type, lines);
  return lines;
}

}  // namespace SecPolicyTest
