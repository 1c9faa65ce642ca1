// The rule types that consist of words and a decision, as one table for tests.
#pragma once

#include <array>
#include <memory>
#include <string>
#include <vector>

#include "domain/keyword_rules.h"

namespace SecPolicyTest {

struct RuleWordRow {
  std::string word;  // one that the word's list holds
  std::string list;  // as traces name it; empty for a free word
};

struct RuleTypeRow {
  std::string keyword;
  std::unique_ptr<SecPolicy::PolicyRules> (*make)();
  std::vector<RuleWordRow> words;
};

template <typename Rules>
std::unique_ptr<SecPolicy::PolicyRules> MakeRules() {
  return std::make_unique<Rules>();
}

// The types whose words are judged by lists alone. The transitions look a domain up besides.
inline const std::array<RuleTypeRow, 6>& KeywordRuleTypes() {
  static const std::array<RuleTypeRow, 6> types{{
      {"-s", MakeRules<SecPolicy::SyscallRules>, {{"openat", "syscall"}}},
      {"-c", MakeRules<SecPolicy::CapabilityRules>, {{"net_admin", "capability"}}},
      {"-p",
       MakeRules<SecPolicy::CapabilityParamRules>,
       {{"net_bind_service", "capability-param"}, {"no-list-has-this", ""}}},
      {"-a", MakeRules<SecPolicy::ObjectAccessRules>, {{"default", "object"}, {"read", "access"}}},
      {"-u",
       MakeRules<SecPolicy::UnixSockCreationRules>,
       {{"default", "object"}, {"stream", "socket-type"}}},
      {"-f",
       MakeRules<SecPolicy::FileCreationRules>,
       {{"default", "object"}, {"tardisk", "object"}, {"fifo", "file-type"}}},
  }};
  return types;
}

// The type's words in their order, those of its table where `replaced` says nothing else.
inline std::string WordsOfType(const RuleTypeRow& type, std::size_t replacedIndex = 99,
                               const std::string& replacement = "") {
  std::string text;
  for (std::size_t i = 0; i < type.words.size(); ++i) {
    if (i != 0) text += " ";
    text += i == replacedIndex ? replacement : type.words[i].word;
  }
  return text;
}

}  // namespace SecPolicyTest
