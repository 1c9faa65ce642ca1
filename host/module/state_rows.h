// The rows that rules are kept in: one on a line of a saved state.
#pragma once

#include <utility>

#include "host/json/json_cursor.h"
#include "host/json/json_writer.h"
#include "host/module/domain_table.h"
#include "host/module/rule.h"

namespace StandIn {

// [keyword, line, words..., decision]; a transition has its target's id behind the words.
void WriteRuleRow(JsonWriter& writer, RuleType type, const Rule& rule);
// [world, path, letters]
void WriteFileRuleRow(JsonWriter& writer, const FileRule& rule);

// Back again. HostError for an unknown keyword, a wrong number of elements, an empty word or one
// with a NUL byte in it, a target that is none of `domains`, a path that will not do, unknown
// letters.
std::pair<RuleType, Rule> ReadRuleRow(const JsonCursor& place, const DomainTable& domains);
FileRule ReadFileRuleRow(const JsonCursor& place);

}  // namespace StandIn
