#include "tests/corpus/word_table.h"

#include <algorithm>
#include <cctype>
#include <map>
#include <stdexcept>

#include "host/module/description_json.h"

namespace SecPolicyTest {

namespace {

using StandIn::WordList;

std::map<std::string, WordTable> MakeTables() {
  const auto description = StandIn::ReadDescription(StandIn::DefaultDescriptionText(), "host.json");
  std::map<std::string, WordTable> tables;
  const auto add = [&](const std::string& title, std::vector<std::string> words) {
    tables[title] = {title, std::move(words)};
  };
  add("system call", description.words.at(WordList::kSyscalls));
  add("capability", description.words.at(WordList::kCapabilities));
  add("capability with parameter", description.words.at(WordList::kParamCapabilities));
  add("object access", description.words.at(WordList::kObjectAccesses));
  add("transition event", description.words.at(WordList::kTransitionEvents));
  add("file type", description.words.at(WordList::kFileTypes));
  add("socket type", description.words.at(WordList::kSocketTypes));
  std::vector<std::string> objects{"default", "tardisk"};
  objects.insert(objects.end(), kCorpusObjects.begin(), kCorpusObjects.end());
  add("object label", objects);
  return tables;
}

bool SameLetter(char a, char b) {
  return std::tolower(static_cast<unsigned char>(a)) == std::tolower(static_cast<unsigned char>(b));
}

// The table of all beginnings against all beginnings, as text books have it.
std::size_t Edits(const std::string& a, const std::string& b) {
  std::vector<std::vector<std::size_t>> edits(a.size() + 1, std::vector<std::size_t>(b.size() + 1));
  for (std::size_t i = 0; i <= a.size(); ++i) {
    for (std::size_t j = 0; j <= b.size(); ++j) {
      if (i == 0 || j == 0) {
        edits[i][j] = i + j;
        continue;
      }
      const std::size_t replaced = edits[i - 1][j - 1] + (SameLetter(a[i - 1], b[j - 1]) ? 0 : 1);
      edits[i][j] = std::min({edits[i - 1][j] + 1, edits[i][j - 1] + 1, replaced});
      const bool isSwap =
          i > 1 && j > 1 && SameLetter(a[i - 1], b[j - 2]) && SameLetter(a[i - 2], b[j - 1]);
      if (isSwap) edits[i][j] = std::min(edits[i][j], edits[i - 2][j - 2] + 1);
    }
  }
  return edits[a.size()][b.size()];
}

}  // namespace

const WordTable& TableOf(std::string_view title) {
  static const std::map<std::string, WordTable> tables = MakeTables();
  return tables.at(std::string(title));
}

std::string UnknownWord(const WordTable& table, const std::string& word) {
  const std::string* nearest = nullptr;
  std::size_t fewest = 0;
  for (const std::string& known : table.words) {
    const std::size_t longer = std::max(word.size(), known.size());
    const std::size_t shorter = std::min(word.size(), known.size());
    const std::size_t allowed = longer < 6 ? 1 : longer / 3;
    if (longer - shorter > allowed) continue;
    const std::size_t edits = Edits(word, known);
    if (edits > allowed || (nearest != nullptr && edits >= fewest)) continue;
    nearest = &known;
    fewest = edits;
  }
  const std::string text = "unknown " + table.title + " \"" + word + "\"";
  return nearest == nullptr ? text : text + " (nearest: " + *nearest + ")";
}

std::vector<std::string> Misspelt(const WordTable& table, const std::string& word) {
  std::string upper = word;
  for (char& c : upper) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  std::string swapped = word;
  std::swap(swapped[0], swapped[word.size() > 1 ? 1 : 0]);
  std::string replaced = word;
  replaced[word.size() / 2] = '9';
  std::vector<std::string> misspelt{
      word.substr(1),
      word.substr(0, word.size() - 1),
      word + word.back(),
      swapped,
      replaced,
      upper,
      upper[0] + word.substr(1),
      "x" + word,
      word + "\t",
      "\t" + word,
      word + "\r",
      "\"" + word + "\"",
      word + "*",
      word + word,
      std::string(word.rbegin(), word.rend()),
      "\xc3\xa4" + word,
      "no-list-has-this",
  };
  std::erase_if(misspelt, [&](const std::string& bad) {
    return bad.empty() ||
           std::find(table.words.begin(), table.words.end(), bad) != table.words.end();
  });
  return misspelt;
}

std::vector<std::string> Some(const WordTable& table, std::size_t count) {
  std::vector<std::string> some;
  const std::size_t step = std::max<std::size_t>(1, table.words.size() / count);
  for (std::size_t i = 0; i < table.words.size() && some.size() < count; i += step) {
    some.push_back(table.words[i]);
  }
  return some;
}

}  // namespace SecPolicyTest
