// Everything that a simulated module holds.
#pragma once

#include <array>
#include <map>
#include <string>

#include "host/module/domain_table.h"
#include "host/module/file_rule_table.h"
#include "host/module/label_table.h"
#include "host/module/module_description.h"
#include "host/module/rule_book.h"
#include "host/module/world_table.h"

namespace StandIn {

struct ModuleState {
  // What a module holds before anything was asked of it.
  explicit ModuleState(const ModuleDescription& description);

  DomainTable domains;
  std::array<LabelTable, 2> labels;  // by LabelType
  RuleBook rules;
  std::map<DomainId, FileRuleTable> fileRules;
  WorldTable worlds;
  std::map<DomainRole, DomainId> roles;
  std::map<std::string, LabelId> fileLabels;  // by path; only files that were labelled
};

}  // namespace StandIn
