#include "host/module/state_rows.h"

#include <optional>

#include "host/module/json_names.h"
#include "host/module/permission_letters.h"
#include "host/module/state_fields.h"
#include "host/text/quoted_name.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

constexpr char kGranted[] = "grant";
constexpr char kRevoked[] = "revoke";

RuleType ReadRuleType(const JsonCursor& place) {
  const std::string keyword = place.String();
  const auto type = ZekCtl::Security::TypeOfKeyword(keyword);
  if (type && InfoOf(*type).HasDecision()) return *type;
  place.Fail("no kind of rules has the keyword " + QuotedName(keyword));
}

Decision ReadDecision(const JsonCursor& place) {
  const std::string word = place.String();
  if (word != kGranted && word != kRevoked) {
    place.Fail(StrCat("must be \"", kGranted, "\" or \"", kRevoked, "\""));
  }
  return word == kGranted ? Decision::kGrant : Decision::kRevoke;
}

}  // namespace

void WriteRuleRow(JsonWriter& writer, RuleType type, const Rule& rule) {
  writer.BeginLine(JsonWriter::Kind::kArray);
  writer.String(InfoOf(type).keyword);
  writer.Number(rule.line);
  for (const std::string& word : rule.words) {
    writer.String(EncodeBytes(word));
  }
  if (InfoOf(type).DomainWord()) {
    writer.Number(rule.targetDomain);
  }
  writer.String(rule.decision == Decision::kGrant ? kGranted : kRevoked);
  writer.End();
}

void WriteFileRuleRow(JsonWriter& writer, const FileRule& rule) {
  writer.BeginLine(JsonWriter::Kind::kArray);
  writer.Number(static_cast<std::uint64_t>(rule.world));
  writer.String(EncodeBytes(rule.path));
  writer.String(PermissionLetters(rule.permission));
  writer.End();
}

std::pair<RuleType, Rule> ReadRuleRow(const JsonCursor& place, const DomainTable& domains) {
  const std::vector<JsonCursor> start = place.Items();
  if (start.empty()) {
    place.Fail("must begin with the keyword of a kind of rules");
  }
  const RuleType type = ReadRuleType(start[0]);
  const std::size_t words = InfoOf(type).wordCount;
  const std::size_t targets = InfoOf(type).DomainWord() ? 1 : 0;
  const std::vector<JsonCursor> row = RowOf(place, 2 + words + targets + 1);
  Rule rule;
  rule.line = Read32(row[1], 0, kMost32);
  for (std::size_t i = 0; i < words; ++i) {
    rule.words.push_back(ReadNonEmpty(row[2 + i]));
  }
  if (targets != 0) {
    rule.targetDomain = ReadDomainId(row[2 + words], domains);
  }
  rule.decision = ReadDecision(row.back());
  return {type, std::move(rule)};
}

FileRule ReadFileRuleRow(const JsonCursor& place) {
  const std::vector<JsonCursor> row = RowOf(place, 3);
  const auto permission = PermissionOfLetters(row[2].String());
  if (!permission) {
    row[2].Fail("must be letters of \"rwx\", in this order");
  }
  return {ReadWorld(row[0], 0), ReadPath(row[1]), *permission};
}

}  // namespace StandIn
