#include "host/module/description_json.h"

#include <algorithm>
#include <limits>
#include <nlohmann/json.hpp>

#include "host/json/json_cursor.h"
#include "host/json/json_writer.h"
#include "host/module/json_names.h"
#include "host/module/word_lists.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using nlohmann::json;
using Tavon::Misc::StrCat;

namespace {

constexpr std::uint64_t kFormat = 1;
constexpr char kDefaultList[] = "default";

struct LimitField {
  const char* key;
  std::uint32_t ModuleLimits::*field;
  std::uint32_t most;  // more than this is a slip of the pen
};
constexpr LimitField kLimits[] = {
    {"domains", &ModuleLimits::domains, 65536},
    {"labels", &ModuleLimits::labels, 16777216},
    {"fileRulesPerDomain", &ModuleLimits::fileRulesPerDomain, 16777216},
};

struct TardiskField {
  const char* key;
  std::string TardiskWords::*field;
  std::string (*read)(const JsonCursor&);
};
constexpr TardiskField kTardiskFields[] = {
    {"launchDomain", &TardiskWords::launchDomain, ReadName},
    {"execEvent", &TardiskWords::execEvent, ReadWord},
    {"defaultLabel", &TardiskWords::defaultLabel, ReadName},
    {"defaultDomain", &TardiskWords::defaultDomain, ReadName},
};

LabelSpace DefaultLabels(std::size_t type) {
  return type == static_cast<std::size_t>(LabelType::kObject)
             ? LabelSpace{{kUnlabelled, "tardisk"}, {}}
             : LabelSpace{};
}

void ReadLimits(const JsonCursor& place, ModuleLimits& limits) {
  place.AllowOnly({kLimits[0].key, kLimits[1].key, kLimits[2].key});
  for (const LimitField& limit : kLimits) {
    if (const auto value = place.Find(limit.key)) {
      limits.*limit.field = static_cast<std::uint32_t>(value->Unsigned(1, limit.most));
    }
  }
}

std::vector<std::string> ReadWords(const std::optional<JsonCursor>& place, WordList list) {
  if (!place) {
    return DefaultWords(list);
  }
  if (place->IsString()) {
    if (place->String() != kDefaultList) {
      place->Fail(StrCat("must be an array of words or \"", kDefaultList, "\""));
    }
    return DefaultWords(list);
  }
  return ReadList(*place, ReadWord);
}

void ReadWordLists(const std::optional<JsonCursor>& place, ModuleDescription& description) {
  if (place) {
    place->AllowOnly({kWordLists[1].key, kWordLists[2].key, kWordLists[3].key, kWordLists[4].key,
                      kWordLists[5].key, kWordLists[6].key, kWordLists[7].key});
  }
  for (const WordListInfo& info : kWordLists) {
    if (info.key != nullptr) {
      description.words[info.list] =
          ReadWords(place ? place->Find(info.key) : std::nullopt, info.list);
    }
  }
}

bool Contains(const std::vector<std::string>& names, const std::string& name) {
  return std::find(names.begin(), names.end(), name) != names.end();
}

void ReadLabelSpace(const JsonCursor& place, LabelSpace& space) {
  place.AllowOnly({"predefined", "invalid"});
  if (const auto predefined = place.Find("predefined")) {
    space.predefined = ReadList(*predefined, ReadName);
  }
  const auto invalid = place.Find("invalid");
  if (!invalid) {
    return;
  }
  space.invalid = ReadList(*invalid, ReadName);
  for (const JsonCursor& item : invalid->Items()) {
    if (Contains(space.predefined, DecodeBytes(item))) {
      item.Fail("is predefined, so that it could never become valid again");
    }
  }
}

void ReadLabels(const JsonCursor& place, ModuleDescription& description) {
  place.AllowOnly({kLabelTypeKeys[0], kLabelTypeKeys[1]});
  for (std::size_t type = 0; type < description.labels.size(); ++type) {
    if (const auto space = place.Find(kLabelTypeKeys[type])) {
      ReadLabelSpace(*space, description.labels[type]);
    }
  }
  const LabelSpace& objects = description.labels[static_cast<std::size_t>(LabelType::kObject)];
  if (!Contains(objects.predefined, kUnlabelled)) {
    place.Member("object")
        .Member("predefined")
        .Fail(StrCat("must list \"", kUnlabelled, "\", which files carry from the start"));
  }
}

void CheckRoomForLabels(const JsonCursor& root, const ModuleDescription& description) {
  for (const LabelSpace& space : description.labels) {
    if (space.predefined.size() > description.limits.labels) {
      root.Fail(StrCat("predefines ", space.predefined.size(),
                       " labels of one type, but the limit is ", description.limits.labels));
    }
  }
}

void ReadWorlds(const JsonCursor& place, std::map<WorldId, std::string>& worlds) {
  for (const JsonCursor& world : place.Items()) {
    world.AllowOnly({"id", "domain"});
    const JsonCursor id = world.Member("id");
    const std::string domain = ReadName(world.Member("domain"));
    const auto number = id.Unsigned(1, std::numeric_limits<WorldId>::max());
    if (!worlds.emplace(static_cast<WorldId>(number), domain).second) {
      id.Fail("is listed twice");
    }
  }
}

void ReadTardisks(const JsonCursor& place, TardiskWords& words) {
  place.AllowOnly(
      {kTardiskFields[0].key, kTardiskFields[1].key, kTardiskFields[2].key, kTardiskFields[3].key});
  for (const TardiskField& field : kTardiskFields) {
    if (const auto value = place.Find(field.key)) {
      words.*field.field = field.read(*value);
    }
  }
}

}  // namespace

ModuleDescription ReadDescription(const std::string& text, const std::string& file) {
  const json document = ParseJson(text, file);
  const JsonCursor root(document, file);
  ExpectFormat(root, kFormat);
  root.AllowOnly({"format", "limits", "enforcementLevel", "words", "labels", "privilegedVms",
                  "worlds", "tardisks"});
  ModuleDescription description;
  for (std::size_t type = 0; type < description.labels.size(); ++type) {
    description.labels[type] = DefaultLabels(type);
  }
  if (const auto limits = root.Find("limits")) {
    ReadLimits(*limits, description.limits);
  }
  if (const auto level = root.Find("enforcementLevel")) {
    description.enforcementLevel = ReadWord(*level);
  }
  ReadWordLists(root.Find("words"), description);
  if (const auto labels = root.Find("labels")) {
    ReadLabels(*labels, description);
  }
  CheckRoomForLabels(root, description);
  if (const auto vms = root.Find("privilegedVms")) {
    description.privilegedVms = ReadList(*vms, ReadName);
  }
  if (const auto worlds = root.Find("worlds")) {
    ReadWorlds(*worlds, description.worlds);
  }
  if (const auto tardisks = root.Find("tardisks")) {
    ReadTardisks(*tardisks, description.tardisk);
  }
  return description;
}

std::string DefaultDescriptionText() {
  const ModuleDescription defaults;
  JsonWriter writer;
  const auto begin = [&writer](const char* key) { writer.Begin(key, JsonWriter::Kind::kObject); };
  writer.Begin(JsonWriter::Kind::kObject);
  writer.Member("format", kFormat);
  begin("limits");
  for (const LimitField& limit : kLimits) {
    writer.Member(limit.key, defaults.limits.*limit.field);
  }
  writer.End();
  writer.Member("enforcementLevel", defaults.enforcementLevel);
  begin("words");
  for (const WordListInfo& info : kWordLists) {
    if (info.key != nullptr) {
      writer.Member(info.key, kDefaultList);
    }
  }
  writer.End();
  begin("labels");
  for (std::size_t type = 0; type < defaults.labels.size(); ++type) {
    const LabelSpace space = DefaultLabels(type);
    begin(kLabelTypeKeys[type]);
    writer.Member("predefined", space.predefined);
    writer.Member("invalid", space.invalid);
    writer.End();
  }
  writer.End();
  writer.Member("privilegedVms", json::array());
  writer.Member("worlds", json::array());
  begin("tardisks");
  for (const TardiskField& field : kTardiskFields) {
    writer.Member(field.key, defaults.tardisk.*field.field);
  }
  writer.End();
  writer.End();
  return writer.Text();
}

}  // namespace StandIn
