// The part of a host file that describes the security module.
//
//   {
//     "format": 1,
//     "limits": {"domains": 1024, "labels": 65536, "fileRulesPerDomain": 1048576},
//     "enforcementLevel": "enforcing",
//     "words": {"capabilities": "default", "paramCapabilities": ["net_admin"], ...},   kWordLists
//     "labels": {"domain": {"predefined": [], "invalid": []},
//                "object": {"predefined": ["default", "tardisk"], "invalid": []}},
//     "privilegedVms": [],
//     "worlds": [{"id": 4711, "domain": "guestDom"}],
//     "tardisks": {"launchDomain": "rootDom", "execEvent": "exec", "defaultLabel": "tardisk",
//                  "defaultDomain": "appDom"}
//   }
//
// All members but "format" may be left out. Names and words are kept as EncodeBytes gives them.
#pragma once

#include <string>

#include "host/module/module_description.h"

namespace StandIn {

// What files carry from the start; always a predefined object label.
inline constexpr char kUnlabelled[] = "default";

// The description that `text`, the content of `file`, gives. Word lists that are left out or
// "default" are those of this machine. HostError with file and place: not JSON, an unknown member,
// a wrong type, a name or a word that will not do, an entry given twice, a limit of 0 or beyond
// reason, `default` not predefined, a label both predefined and invalid.
ModuleDescription ReadDescription(const std::string& text, const std::string& file);

// A host file in which everything is as it is when it is left out.
std::string DefaultDescriptionText();

}  // namespace StandIn
