// The labels of one type.
#pragma once

#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <unordered_map>
#include <vector>

#include "host/module/module_description.h"
#include "host/module/rule.h"

namespace StandIn {

class LabelTable {
 public:
  // What a table holds beside what its description says.
  struct Contents {
    std::map<LabelId, std::string> defined;
    LabelId next = 1;               // above every id given so far
    std::set<std::string> removed;  // names that were removed at least once
  };

  // Defines the predefined labels, in their order. `title` is what messages call a label
  // ("object label"); `limit` is the number of labels that can be defined at one time.
  LabelTable(const char* title, std::uint32_t limit, const LabelSpace& space);

  // Takes over other contents, whose names must be good and unlike; predefined labels that are not
  // among them are defined. ModuleError ENOSPC.
  void Load(Contents contents);
  [[nodiscard]] const Contents& Held() const { return contents_; }

  // ModuleError as SecurityModule::AddLabels and RemoveLabels.
  void Add(const std::string& name);
  void Remove(const std::string& name);

  [[nodiscard]] bool IsPredefined(const std::string& name) const;
  [[nodiscard]] bool Defines(const std::string& name) const { return ids_.contains(name); }
  [[nodiscard]] bool Defines(LabelId id) const { return contents_.defined.contains(id); }
  // ModuleError ENOENT when there is none.
  [[nodiscard]] LabelId IdOf(const std::string& name) const;
  [[nodiscard]] std::string NameOf(LabelId id) const;
  // Labels defined now that the description calls invalid and that were never removed, in its
  // order.
  [[nodiscard]] std::vector<std::string> Invalid() const;
  [[nodiscard]] std::map<std::string, long> Ids() const;
  // In the order of their ids.
  [[nodiscard]] std::vector<std::string> Names() const;

 private:
  void DefinePredefined();

  const char* title_;
  std::uint32_t limit_;
  LabelSpace space_;
  std::set<std::string> predefined_;
  Contents contents_;
  std::unordered_map<std::string, LabelId> ids_;
};

}  // namespace StandIn
