// Names, words and paths read from a JSON document, judged as the module judges them.
#pragma once

#include <array>
#include <string>
#include <vector>

#include "host/json/json_cursor.h"

namespace StandIn {

// The members of "labels" in host files and saved states, by LabelType.
inline constexpr std::array<const char*, 2> kLabelTypeKeys{"domain", "object"};

// A name of a domain or label, a file rule's path: a string as EncodeBytes gives it. HostError
// `FILE: PLACE: FAULT`, with a fault of names.h.
std::string ReadName(const JsonCursor& place);
std::string ReadPath(const JsonCursor& place);
// Any bytes but none at all and NUL: a parameter, a service.
std::string ReadNonEmpty(const JsonCursor& place);
// One word of a policy line: neither empty nor with blanks or control characters in it.
std::string ReadWord(const JsonCursor& place);

// An array of them, each read by `readOne`. HostError "is listed twice" for one that is.
std::vector<std::string> ReadList(const JsonCursor& place,
                                  std::string (*readOne)(const JsonCursor&));

}  // namespace StandIn
