#include "tests/corpus/corpus_texts.h"

#include "tests/corpus/corpus.h"

namespace SecPolicyTest {

using StandIn::RuleType;

std::string WithFileMark(std::string text, const std::string& path) {
  for (std::size_t at = 0; (at = text.find(path, at)) != std::string::npos;) {
    text.replace(at, path.size(), kFile);
  }
  return text;
}

std::string RecordOf(RuleType type, const StandIn::Rule& rule) {
  std::string record;
  for (std::size_t i = 0; i < rule.words.size(); ++i) {
    record += "|" + rule.words[i];
    if (type == RuleType::kTransition && i == 1) record += "=" + std::to_string(rule.targetDomain);
  }
  record += rule.decision == StandIn::Decision::kGrant ? "|grant" : "|revoke";
  return std::to_string(rule.line) + " " + InfoOf(type).keyword + record;
}

}  // namespace SecPolicyTest
