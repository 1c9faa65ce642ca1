// A machine small enough that a fuzzer finds its words.
#pragma once

#include <string>
#include <vector>

#include "tests/support/memory_host.h"

namespace Fuzz {

// Every module of the small world has these.
inline const std::vector<std::string> kSmallDomains{"rootDom", "appDom", "netDom"};
inline const std::vector<std::string> kSmallObjects{"default", "tardisk", "logs"};
inline constexpr unsigned int kAppDomain = 1;  // the id of appDom

// Its description, with room for few domains, labels and file rules.
const StandIn::ModuleDescription& SmallDescription();

// Makes the domains and objects that the description alone does not give.
void Populate(StandIn::SecurityModule& module);

}  // namespace Fuzz
