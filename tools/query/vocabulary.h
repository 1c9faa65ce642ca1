// The words that questions about a policy may use.
#pragma once

#include <map>
#include <string>
#include <vector>

#include "host/image/host_directory.h"
#include "host/module/security_module.h"
#include "tools/policy/policy.h"

namespace SecPolicyTool {

struct Vocabulary {
  std::map<StandIn::WordList, std::vector<std::string>> lists;
  std::vector<std::string> domains;
};

// The words of the host's lists, and the objects and domains of `policy`. Throws HostError when the
// host's description is damaged.
Vocabulary VocabularyOf(const StandIn::HostDirectory& host, const Policy& policy);

// "no domain is called NAME (nearest: OTHER)", or without the bracket when none is near.
std::string UnknownDomainText(const std::string& name, const std::vector<std::string>& domains);

// The domain of that name. Throws std::runtime_error with that text.
const DomainContent& DomainOf(const Policy& policy, const std::string& name);

}  // namespace SecPolicyTool
