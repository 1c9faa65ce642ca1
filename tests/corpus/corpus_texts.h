// What the library threw and what the kernel holds, in the words of CorpusCase.
#pragma once

#include <string>

#include "host/module/rule.h"

namespace SecPolicyTest {

// What the held file carries before each file of labels; near to no word.
inline const std::string kFirstLabel(60, '~');

// `text` with the mark of a file's path instead of `path`.
std::string WithFileMark(std::string text, const std::string& path);

// A rule as the kernel holds it: line, keyword, words, a target's id, decision.
std::string RecordOf(StandIn::RuleType type, const StandIn::Rule& rule);

}  // namespace SecPolicyTest
