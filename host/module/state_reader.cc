#include <limits>
#include <set>

#include "host/json/json_stream.h"
#include "host/module/json_names.h"
#include "host/module/module_error.h"
#include "host/module/state_fields.h"
#include "host/module/state_json.h"
#include "host/module/state_rows.h"
#include "host/text/quoted_name.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

namespace {

// ---- Domains ----

DomainOrigin ReadOrigin(const JsonCursor& place) {
  const std::string origin = place.String();
  if (origin != kOfPolicy && origin != kOfRunTime) {
    place.Fail(StrCat("must be \"", kOfPolicy, "\" or \"", kOfRunTime, "\""));
  }
  return origin == kOfRunTime ? DomainOrigin::kRunTime : DomainOrigin::kPolicy;
}

ProcessIdentity ReadMaker(const JsonCursor& place) {
  place.AllowOnly({"pid", "startTime"});
  return {static_cast<pid_t>(place.Member("pid").Unsigned(1, kMostWorld)),
          place.Member("startTime").Unsigned(0, std::numeric_limits<std::uint64_t>::max())};
}

Domain ReadDomain(const JsonCursor& place) {
  place.AllowOnly({"id", "name", "origin", "maker", "services", "rules", "fileRules"});
  Domain domain;
  domain.name = ReadName(place.Member("name"));
  domain.origin = ReadOrigin(place.Member("origin"));
  if (domain.origin == DomainOrigin::kRunTime) {
    domain.maker = ReadMaker(place.Member("maker"));
  } else if (const auto maker = place.Find("maker")) {
    maker->Fail("only a domain made at run time has a maker");
  }
  if (const auto services = place.Find("services")) {
    domain.services = ReadList(*services, ReadNonEmpty);
  }
  return domain;
}

void RequirePredefined(const JsonCursor& place, const Domain& domain) {
  if (domain.name != kRootDomainName || domain.origin != DomainOrigin::kPolicy) {
    place.Fail(StrCat("slot ", kRootDomain, " is the predefined domain \"", kRootDomainName, "\""));
  }
}

// The domains alone: rules need all of them.
void ReadDomains(const JsonCursor& document, DomainTable& domains) {
  bool metRoot = false;
  for (const JsonCursor& place : ItemsOf(document, "domains")) {
    Domain domain = ReadDomain(place);
    const DomainId id = Read32(place.Member("id"), 0, domains.Slots() - 1);
    if (id == kRootDomain && !metRoot) {
      RequirePredefined(place, domain);
      metRoot = true;
      for (const std::string& service : domain.services) {
        domains.AddService(kRootDomain, service);
      }
      continue;
    }
    if (domains.Get(id) != nullptr) {
      place.Member("id").Fail(StrCat("the id ", id, " is taken"));
    }
    if (domains.Find(domain.name)) {
      place.Member("name").Fail("a domain named " + QuotedName(domain.name) + " exists already");
    }
    domains.CreateAt(id, std::move(domain));
  }
}

// ---- Rules ----

void ReadRule(const JsonCursor& place, DomainId domain, ModuleState& state) {
  const auto [type, rule] = ReadRuleRow(place, state.domains);
  if (state.rules.Holds(type, domain, rule.words)) {
    place.Fail("the words of this rule are decided on already");
  }
  state.rules.Set(type, domain, rule);
}

void ReadFileRule(const JsonCursor& place, std::uint32_t limit, FileRuleTable& table) {
  const FileRule rule = ReadFileRuleRow(place);
  if (table.Holds(rule.world, rule.path)) {
    place.Fail("this path has a rule already");
  }
  if (table.Size() >= limit) {
    place.Fail(StrCat("the domain has more than ", limit, " file rules"));
  }
  table.Set(rule);
}

// Refuses a member that is there and is no array.
void ExpectArray(const JsonCursor& object, const char* key) {
  if (const auto member = object.Find(key)) member->ExpectArray();
}

// The ids of the domains, in the order of the file. Their rules are not there yet.
std::vector<DomainId> ReadDomainIds(const JsonCursor& document, const DomainTable& domains) {
  std::vector<DomainId> ids;
  for (const JsonCursor& place : ItemsOf(document, "domains")) {
    ids.push_back(ReadDomainId(place.Member("id"), domains));
    ExpectArray(place, "rules");
    ExpectArray(place, "fileRules");
  }
  return ids;
}

// ---- Roles, worlds and labels ----

void ReadRoles(const JsonCursor& document, ModuleState& state) {
  const auto roles = document.Find("roles");
  if (!roles) {
    return;
  }
  roles->AllowOnly({kRoleKeys[0].key, kRoleKeys[1].key});
  for (const auto& [role, key] : kRoleKeys) {
    if (const auto domain = roles->Find(key)) {
      state.roles[role] = ReadDomainId(*domain, state.domains);
    }
  }
}

void ReadWorlds(const JsonCursor& document, ModuleState& state) {
  for (const JsonCursor& place : ItemsOf(document, "worlds")) {
    const std::vector<JsonCursor> row = RowOf(place, 2);
    const WorldId world = ReadWorld(row[0], 1);
    if (state.worlds.Placed().contains(world)) {
      row[0].Fail(StrCat("the world ", world, " is placed already"));
    }
    state.worlds.Place(world, ReadDomainId(row[1], state.domains));
  }
}

void ReadDefinedLabel(const JsonCursor& place, LabelTable::Contents& contents,
                      std::set<std::string>& names) {
  const std::vector<JsonCursor> row = RowOf(place, 2);
  const LabelId id = Read32(row[0], 1, kMost32);
  if (id >= contents.next) {
    row[0].Fail(StrCat("is not below the next id, ", contents.next));
  }
  const std::string name = ReadName(row[1]);
  if (!names.insert(name).second) {
    row[1].Fail("is listed twice");
  }
  if (!contents.defined.emplace(id, name).second) {
    row[0].Fail(StrCat("the id ", id, " is taken"));
  }
}

LabelTable::Contents ReadLabelContents(const JsonCursor& place, std::uint32_t limit) {
  place.AllowOnly({"next", "defined", "removed"});
  LabelTable::Contents contents;
  contents.next = Read32(place.Member("next"), 1, kMost32);
  std::set<std::string> names;
  for (const JsonCursor& label : ItemsOf(place, "defined")) {
    ReadDefinedLabel(label, contents, names);
  }
  if (names.size() > limit) {
    place.Member("defined").Fail(StrCat("has more than ", limit, " labels"));
  }
  if (const auto removed = place.Find("removed")) {
    const std::vector<std::string> list = ReadList(*removed, ReadName);
    contents.removed.insert(list.begin(), list.end());
  }
  return contents;
}

void ReadLabels(const JsonCursor& document, std::uint32_t limit, ModuleState& state) {
  const auto labels = document.Find("labels");
  if (!labels) {
    return;
  }
  labels->AllowOnly({kLabelTypeKeys[0], kLabelTypeKeys[1]});
  for (std::size_t type = 0; type < kLabelTypeKeys.size(); ++type) {
    const auto place = labels->Find(kLabelTypeKeys[type]);
    if (!place) {
      continue;
    }
    try {
      state.labels[type].Load(ReadLabelContents(*place, limit));
    } catch (const ModuleError& error) {  // no room for a predefined label that is missing
      place->Fail(error.what());
    }
  }
}

void ReadFileLabel(const JsonCursor& place, LabelId next, ModuleState& state) {
  const std::vector<JsonCursor> row = RowOf(place, 2);
  const std::string path = ReadNonEmpty(row[0]);
  const LabelId label = Read32(row[1], 1, kMost32);
  if (label >= next) {
    row[1].Fail(StrCat("no object label ever had the id ", label));
  }
  if (!state.fileLabels.emplace(path, label).second) {
    row[0].Fail("is listed twice");
  }
}

// ---- The whole ----

// There may be millions of rules and of labelled files. Rules need all domains, and the labels of
// files all labels, wherever these are in the text: so it is read twice, without them and for them.
std::vector<JsonArrays> Rows() {
  return {{{"domains", "*", "rules"}}, {{"domains", "*", "fileRules"}}, {{"fileLabels"}}};
}

// All but the rows. Gives the ids of the domains in the order of the file.
std::vector<DomainId> ReadHeads(const TextReader& text, const std::string& file,
                                const ModuleDescription& description, ModuleState& state) {
  const JsonDocument document = ParseJsonBut(Rows(), text, file);
  const JsonCursor root(document.Value(), file);
  ExpectFormat(root, kStateFormat);
  root.AllowOnly({"format", "domains", "roles", "worlds", "labels", "fileLabels"});
  ReadDomains(root, state.domains);
  std::vector<DomainId> ids = ReadDomainIds(root, state.domains);
  ReadRoles(root, state);
  ReadWorlds(root, state);
  ReadLabels(root, description.limits.labels, state);
  ExpectArray(root, "fileLabels");
  return ids;
}

void ReadRows(const TextReader& text, const std::string& file, std::uint32_t fileRuleLimit,
              const std::vector<DomainId>& domains, ModuleState& state) {
  const LabelId next = state.labels[static_cast<std::size_t>(LabelType::kObject)].Held().next;
  const auto domainOf = [&](const JsonCursor& place, std::span<const std::size_t> indexes) {
    if (indexes[0] >= domains.size()) place.Fail("was added while the file was read");
    return domains[indexes[0]];
  };
  std::vector<JsonArrays> rows = Rows();
  rows[0].take = [&](const JsonCursor& row, std::span<const std::size_t> indexes) {
    ReadRule(row, domainOf(row, indexes), state);
  };
  rows[1].take = [&](const JsonCursor& row, std::span<const std::size_t> indexes) {
    ReadFileRule(row, fileRuleLimit, state.fileRules[domainOf(row, indexes)]);
  };
  rows[2].take = [&](const JsonCursor& row, std::span<const std::size_t>) {
    ReadFileLabel(row, next, state);
  };
  ParseJsonBut(rows, text, file);
}

}  // namespace

std::unique_ptr<ModuleState> ReadState(const TextReader& text, const std::string& file,
                                       const ModuleDescription& description) {
  auto state = std::make_unique<ModuleState>(description);
  const std::vector<DomainId> domains = ReadHeads(text, file, description, *state);
  ReadRows(text, file, description.limits.fileRulesPerDomain, domains, *state);
  return state;
}

}  // namespace StandIn
