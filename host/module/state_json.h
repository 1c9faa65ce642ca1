// What a simulated module holds, as a text that people can read and compare.
//
//   {
//     "format": 1,
//     "domains": [                       ascending ids; slot 0 is the predefined domain
//       {
//         "id": 3,
//         "name": "appDom",
//         "origin": "policy",            or "runTime", which has a maker:
//         "maker": {"pid": 812, "startTime": 99120},
//         "services": ["console"],
//         "rules": [                     keyword, line, words, decision; type by type, each in the
//           ["-s", 4, "open", "grant"],  order in which the words were first set
//           ["-d", 5, "default", "utilDom", "exec", 2, "revoke"]      2: the target's id
//         ],
//         "fileRules": [[0, "/etc/motd", "rw"]]                       world, path, permission
//       }
//     ],
//     "roles": {"globalVM": 1, "ioFilter": 2},
//     "worlds": [[4711, 3]],             the worlds placed, and their domains
//     "labels": {                        of both types
//       "domain": {"next": 1, "defined": [], "removed": []},
//       "object": {"next": 4, "defined": [[1, "default"], [3, "logs"]], "removed": ["old"]}
//     },
//     "fileLabels": [["/etc/motd", 3]]
//   }
//
// All members but "format" and the ones that name or number something may be left out; what is
// empty is left out of a domain. Names, words and paths are kept as EncodeBytes gives them.
#pragma once

#include <memory>
#include <string>

#include "host/json/text_reader.h"
#include "host/module/module_state.h"

namespace StandIn {

// Hands the text over in parts: the same text for the same contents. Throws what `sink` throws.
void WriteState(const ModuleState& state, const TextSink& sink);

// What `text`, the content of `file`, says. It is read twice, in blocks; no more of it is kept than
// what is not a rule or the label of a file. Words of rules need not stand in the description's
// lists; worlds of file rules need not be known; labels of files may have been removed; predefined
// labels that are missing are defined. HostError with file and place for anything else that a
// module of this description could not hold.
std::unique_ptr<ModuleState> ReadState(const TextReader& text, const std::string& file,
                                       const ModuleDescription& description);

}  // namespace StandIn
