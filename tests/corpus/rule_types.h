// The seven rule types that end in a decision, as the corpus knows them.
#pragma once

#include <string>
#include <vector>

#include "tests/corpus/word_table.h"

namespace SecPolicyTest {

// What decides whether a word will do.
enum class Judge { kTable, kNobody, kDomains };

// One word of a type's lines.
struct CorpusPlace {
  Judge judge;
  WordTable table;  // accepted words; of a free word, examples
};

struct CorpusRuleType {
  std::string keyword;
  std::vector<CorpusPlace> places;
};

// The type of that keyword.
CorpusRuleType TypeOf(const std::string& keyword);

}  // namespace SecPolicyTest
