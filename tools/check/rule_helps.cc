#include "tools/check/rule_helps.h"

#include <cctype>

#include "host/module/nearest_word.h"

namespace SecPolicyTool {

std::string HelpForCount(const RuleTypeInfo& info) {
  std::string form = std::string("write: ") + info.keyword;
  for (const RuleWordInfo& word : info.Words()) {
    form += " ";
    for (const char* c = word.name; *c != '\0'; ++c) {
      form += *c == ' ' || *c == '\'' ? '-' : static_cast<char>(std::toupper(*c));
    }
  }
  return form + (info.HasDecision() ? " grant|revoke" : " [r][w][x]");
}

std::string HelpForType(const std::string& word) {
  std::string letters;
  for (const char c : word) {
    if (std::isalnum(static_cast<unsigned char>(c)) != 0) {
      letters += static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
  }
  if (TypeOfKeyword("-" + letters)) return "did you mean \"-" + letters + "\"?";
  if (letters == "e") return "-E stands in the policy files of tardisks";
  std::string help = "the rule types are";
  for (const RuleTypeInfo& info : kRuleTypes) help += std::string(" ") + info.keyword;
  return help;
}

std::string HelpForDecision(const std::string& word) {
  const auto nearest = StandIn::NearestWord(word, {"grant", "revoke"});
  return nearest ? "did you mean \"" + *nearest + "\"?" : "a rule ends in grant or revoke";
}

}  // namespace SecPolicyTool
