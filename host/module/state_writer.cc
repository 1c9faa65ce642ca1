#include <nlohmann/json.hpp>

#include "host/json/json_cursor.h"
#include "host/json/json_writer.h"
#include "host/module/json_names.h"
#include "host/module/state_fields.h"
#include "host/module/state_json.h"
#include "host/module/state_rows.h"

namespace StandIn {

namespace {

constexpr JsonWriter::Kind kObject = JsonWriter::Kind::kObject;
constexpr JsonWriter::Kind kArray = JsonWriter::Kind::kArray;

template <typename Names>
void WriteNames(JsonWriter& writer, const char* key, const Names& names) {
  writer.BeginLine(key, kArray);
  for (const std::string& name : names) {
    writer.String(EncodeBytes(name));
  }
  writer.End();
}

void WriteRules(JsonWriter& writer, const RuleBook& book, DomainId domain) {
  bool begun = false;
  for (const auto& info : ZekCtl::Security::kRuleTypes) {
    book.ForEach(info.type, domain, [&](const Rule& rule) {
      if (!begun) {
        writer.Begin("rules", kArray);
        begun = true;
      }
      WriteRuleRow(writer, info.type, rule);
    });
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
    WriteFileRuleRow(writer, rule);
  }
  writer.End();
}

void WriteDomain(JsonWriter& writer, const ModuleState& state, DomainId id, const Domain& domain) {
  writer.Begin(kObject);
  writer.Member("id", id);
  writer.Member("name", EncodeBytes(domain.name));
  if (domain.origin == DomainOrigin::kRunTime) {
    writer.Member("origin", kOfRunTime);
    writer.BeginLine("maker", kObject);
    writer.Member("pid", domain.maker.pid);
    writer.Member("startTime", domain.maker.startTime);
    writer.End();
  } else {
    writer.Member("origin", kOfPolicy);
  }
  if (!domain.services.empty()) {
    WriteNames(writer, "services", domain.services);
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
  writer.BeginLine("roles", kObject);
  for (const auto& [role, key] : kRoleKeys) {
    if (const auto domain = roles.find(role); domain != roles.end()) {
      writer.Member(key, domain->second);
    }
  }
  writer.End();
}

void WriteLabels(JsonWriter& writer, const ModuleState& state) {
  writer.Begin("labels", kObject);
  for (std::size_t type = 0; type < kLabelTypeKeys.size(); ++type) {
    const LabelTable::Contents& contents = state.labels[type].Held();
    writer.Begin(kLabelTypeKeys[type], kObject);
    writer.Member("next", contents.next);
    writer.Begin("defined", kArray);
    for (const auto& [id, name] : contents.defined) {
      writer.BeginLine(kArray);
      writer.Number(id);
      writer.String(EncodeBytes(name));
      writer.End();
    }
    writer.End();
    WriteNames(writer, "removed", contents.removed);
    writer.End();
  }
  writer.End();
}

}  // namespace

void WriteState(const ModuleState& state, const TextSink& sink) {
  JsonWriter writer(sink);
  writer.Begin(kObject);
  writer.Member("format", kStateFormat);
  WriteDomains(writer, state);
  WriteRoles(writer, state.roles);
  writer.Begin("worlds", kArray);
  for (const auto& [world, domain] : state.worlds.Placed()) {
    writer.BeginLine(kArray);
    writer.Number(static_cast<std::uint64_t>(world));
    writer.Number(domain);
    writer.End();
  }
  writer.End();
  WriteLabels(writer, state);
  writer.Begin("fileLabels", kArray);
  for (const auto& [path, label] : state.fileLabels) {
    writer.BeginLine(kArray);
    writer.String(EncodeBytes(path));
    writer.Number(label);
    writer.End();
  }
  writer.End();
  writer.End();
  writer.Finish();
}

}  // namespace StandIn
