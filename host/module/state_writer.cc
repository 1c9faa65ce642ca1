#include "host/json/json_cursor.h"

#include <nlohmann/json.hpp>
#include "host/json/json_writer.h"
#include "host/module/json_names.h"
#include "host/module/state_fields.h"
#include "host/module/state_json.h"
#include "host/module/state_rows.h"

namespace StandIn {

using nlohmann::json;

namespace {

constexpr JsonWriter::Kind kObject = JsonWriter::Kind::kObject;
constexpr JsonWriter::Kind kArray = JsonWriter::Kind::kArray;

json Encoded(const std::vector<std::string>& names) {
  json encoded = json::array();
  for (const std::string& name : names) {
    encoded.push_back(EncodeBytes(name));
  }
  return encoded;
}

void WriteRules(JsonWriter& writer, const RuleBook& book, DomainId domain) {
  bool begun = false;
  for (std::size_t i = 0; i < kRuleKinds; ++i) {
    const auto kind = static_cast<RuleKind>(i);
    for (const Rule& rule : book.Rules(kind, domain)) {
      if (!begun) {
        writer.Begin("rules", kArray);
        begun = true;
      }
      writer.Item(RuleRow(kind, rule));
    }
  }
  if (begun) {
    writer.End();
  }
}

void WriteFileRules(JsonWriter& writer, const ModuleState& state, DomainId domain) {
  const auto table = state.fileRules.find(domain);
  if (table == state.fileRules.end() || table->second.Size() == 0) {
    return;
  }
  writer.Begin("fileRules", kArray);
  for (const FileRule& rule : table->second.Rules()) {
    writer.Item(FileRuleRow(rule));
  }
  writer.End();
}

void WriteDomain(JsonWriter& writer, const ModuleState& state, DomainId id, const Domain& domain) {
  writer.Begin(kObject);
  writer.Member("id", id);
  writer.Member("name", EncodeBytes(domain.name));
  if (domain.origin == DomainOrigin::kRunTime) {
    writer.Member("origin", kOfRunTime);
    writer.Member("maker", {{"pid", domain.maker.pid}, {"startTime", domain.maker.startTime}});
  } else {
    writer.Member("origin", kOfPolicy);
  }
  if (!domain.services.empty()) {
    writer.Member("services", Encoded(domain.services));
  }
  WriteRules(writer, state.rules, id);
  WriteFileRules(writer, state, id);
  writer.End();
}

void WriteDomains(JsonWriter& writer, const ModuleState& state) {
  writer.Begin("domains", kArray);
  for (const auto& [id, domain] : state.domains.All()) {
    WriteDomain(writer, state, id, domain);
  }
  writer.End();
}

void WriteRoles(JsonWriter& writer, const std::map<DomainRole, DomainId>& roles) {
  json members = json::object();
  for (const auto& [role, key] : kRoleKeys) {
    if (const auto domain = roles.find(role); domain != roles.end()) {
      members[key] = domain->second;
    }
  }
  writer.Member("roles", members);
}

void WriteLabels(JsonWriter& writer, const ModuleState& state) {
  writer.Begin("labels", kObject);
  for (std::size_t type = 0; type < kLabelTypeKeys.size(); ++type) {
    const LabelTable::Contents& contents = state.labels[type].Held();
    writer.Begin(kLabelTypeKeys[type], kObject);
    writer.Member("next", contents.next);
    writer.Begin("defined", kArray);
    for (const auto& [id, name] : contents.defined) {
      writer.Item({id, EncodeBytes(name)});
    }
    writer.End();
    writer.Member("removed", Encoded({contents.removed.begin(), contents.removed.end()}));
    writer.End();
  }
  writer.End();
}

}  // namespace

std::string WriteState(const ModuleState& state) {
  JsonWriter writer;
  writer.Begin(kObject);
  writer.Member("format", kStateFormat);
  WriteDomains(writer, state);
  WriteRoles(writer, state.roles);
  writer.Begin("worlds", kArray);
  for (const auto& [world, domain] : state.worlds.Placed()) {
    writer.Item({world, domain});
  }
  writer.End();
  WriteLabels(writer, state);
  writer.Begin("fileLabels", kArray);
  for (const auto& [path, label] : state.fileLabels) {
    writer.Item({EncodeBytes(path), label});
  }
  writer.End();
  writer.End();
  return writer.Text();
}

}  // namespace StandIn
