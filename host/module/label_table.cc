#include "host/module/label_table.h"

#include <cerrno>
#include <limits>

#include "host/module/module_error.h"
#include "host/module/names.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

LabelTable::LabelTable(const char* title, std::uint32_t limit, const LabelSpace& space)
    : title_(title),
      limit_(limit),
      space_(space),
      predefined_(space.predefined.begin(), space.predefined.end()) {
  DefinePredefined();
}

void LabelTable::Load(Contents contents) {
  contents_ = std::move(contents);
  ids_.clear();
  for (const auto& [id, name] : contents_.defined) {
    ids_.emplace(name, id);
  }
  DefinePredefined();
}

void LabelTable::DefinePredefined() {
  for (const std::string& name : space_.predefined) {
    Add(name);
  }
}

void LabelTable::Add(const std::string& name) {
  RequireName(StrCat(title_, " name").c_str(), name);
  if (Defines(name)) {
    return;
  }
  const bool idsAreUsedUp = contents_.next == std::numeric_limits<LabelId>::max();
  if (ids_.size() >= limit_ || idsAreUsedUp) {
    throw ModuleError(ENOSPC, StrCat("no id is free for the ", title_, " \"", name, "\": all ",
                                     idsAreUsedUp ? contents_.next : limit_, " are taken"));
  }
  const auto place = ids_.emplace(name, contents_.next).first;
  try {
    contents_.defined.emplace(contents_.next, name);
  } catch (...) {
    ids_.erase(place);
    throw;
  }
  ++contents_.next;
}

void LabelTable::Remove(const std::string& name) {
  if (IsPredefined(name)) {
    throw ModuleError(EPERM, StrCat("the ", title_, " \"", name, "\" is predefined and stays"));
  }
  const auto found = ids_.find(name);
  if (found == ids_.end()) {
    return;
  }
  contents_.removed.insert(name);
  contents_.defined.erase(found->second);
  ids_.erase(found);
}

bool LabelTable::IsPredefined(const std::string& name) const { return predefined_.contains(name); }

LabelId LabelTable::IdOf(const std::string& name) const {
  const auto found = ids_.find(name);
  if (found == ids_.end()) {
    throw ModuleError(ENOENT, StrCat("no ", title_, " is named \"", name, "\""));
  }
  return found->second;
}

std::string LabelTable::NameOf(LabelId id) const {
  const auto found = contents_.defined.find(id);
  if (found == contents_.defined.end()) {
    throw ModuleError(ENOENT, StrCat("no ", title_, " has the id ", id));
  }
  return found->second;
}

std::vector<std::string> LabelTable::Invalid() const {
  std::vector<std::string> invalid;
  for (const std::string& name : space_.invalid) {
    if (Defines(name) && !contents_.removed.contains(name)) {
      invalid.push_back(name);
    }
  }
  return invalid;
}

std::map<std::string, long> LabelTable::Ids() const { return {ids_.begin(), ids_.end()}; }

std::vector<std::string> LabelTable::Names() const {
  std::vector<std::string> names;
  for (const auto& [id, name] : contents_.defined) {
    names.push_back(name);
  }
  return names;
}

}  // namespace StandIn
