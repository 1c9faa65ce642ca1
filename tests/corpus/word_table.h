// What each word of a line may be, and the messages about words that it may not be.
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace SecPolicyTest {

// A list of accepted words, in the order in which the nearest one is looked for.
struct WordTable {
  std::string title;  // what messages call one of its words
  std::vector<std::string> words;
};

// The lists of the default host, by the title.
const WordTable& TableOf(std::string_view title);

// The objects and domains that the corpus's kernel has: the predefined ones, and these.
inline const std::vector<std::string> kCorpusObjects{"logs", "netConf", "webUi-conf"};
inline const std::vector<std::string> kCorpusDomains{"rootDom", "appDom", "netDom", "utilDom"};

// What the platform refuses `word` with.
std::string UnknownWord(const WordTable& table, const std::string& word);

// Words that look like `word` and are not in the table: misspelt, of other case, with a tab or a
// carriage return, in quotation marks...
std::vector<std::string> Misspelt(const WordTable& table, const std::string& word);

// Up to `count` words of the table, evenly spread.
std::vector<std::string> Some(const WordTable& table, std::size_t count);

}  // namespace SecPolicyTest
