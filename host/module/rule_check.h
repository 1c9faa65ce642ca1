// Whether the words of rules will do.
#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "host/module/rule.h"
#include "host/module/security_module.h"

namespace StandIn {

// Throws ModuleError EINVAL unless the rule has as many words as its type asks for, each of which
// stands in its list, as `validate` judges (by throwing), or is a name (a transition's target) or a
// parameter, which must not be empty or hold a NUL.
void CheckRuleWords(RuleType type, const Rule& rule,
                    const std::function<void(WordList, const std::string&)>& validate);

// As SecurityModule::CheckCapabilityParams.
void CheckCapabilityContradictions(const std::string& domainName, const std::vector<Rule>& rules);

}  // namespace StandIn
