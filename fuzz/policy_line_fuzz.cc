// The reader of policy lines against a second reading, and what holds of words whatever the bytes.
#include "fuzz/support/input.h"
#include "fuzz/support/plain_reader.h"
#include "fuzz/support/require.h"
#include "secpolicy/secpolicy.h"

namespace {

Fuzz::PlainWords WordsOf(std::queue<std::string> queue) {
  Fuzz::PlainWords words;
  for (; !queue.empty(); queue.pop()) words.push_back(queue.front());
  return words;
}

// "invalid keyword " and the word, or nothing for the two words that are decisions.
std::string RefusalOf(std::string word) try {
  const bool isGrant = SecPolicy::IsGrant(word);
  Fuzz::Require(word == (isGrant ? "grant" : "revoke"), "a decision is one of two words");
  return "";
} catch (const Tavon::Lib::TavonException& failure) {
  Fuzz::Require(word != "grant" && word != "revoke", "both decisions are accepted");
  return failure.what();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string line = Fuzz::BytesOf(data, size);
  const Fuzz::PlainWords words = WordsOf(SecPolicy::ParsePolicyLine(line));
  Fuzz::Require(words == Fuzz::PlainWordsOf(line), "both readings give the same words");
  for (const std::string& word : words) {
    Fuzz::Require(!word.empty(), "no word is empty");
    Fuzz::Require(word.find_first_of(" #") == std::string::npos, "no word holds a separator");
    const std::string refusal = RefusalOf(word);
    Fuzz::Require(refusal.empty() || refusal == std::string("invalid keyword ") + word.c_str(),
                  "a refused decision is named");
  }
  const std::string joined = Fuzz::Joined(words);
  Fuzz::Require(WordsOf(SecPolicy::StringToQueue(joined)) == words, "joined words read the same");
  return 0;
}
