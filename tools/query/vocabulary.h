// The words that questions about a policy may use.
#pragma once

#include <map>
#include <string>
#include <vector>

#include "host/module/security_module.h"
#include "host/state/host_directory.h"
#include "tools/policy/policy.h"

namespace SecPolicyTool {

struct Vocabulary {
  std::map<StandIn::WordList, std::vector<std::string>> lists;
  std::vector<std::string> domains;
};

// The words of the host's lists, and the objects and domains of `policy`. Throws HostError when the
// host's description is damaged.
Vocabulary VocabularyOf(const StandIn::HostDirectory& host, const Policy& policy);

// The domain of that name. Throws BadRequest `unknown domain "NAME"`, as UnknownWordText.
const DomainContent& DomainOf(const Policy& policy, const std::string& name);

}  // namespace SecPolicyTool
