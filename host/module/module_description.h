// What a module is told about the machine that it stands for.
#pragma once

#include <array>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "host/module/security_module.h"

namespace StandIn {

struct ModuleLimits {
  std::uint32_t domains = 1024;
  std::uint32_t labels = 65536;  // of each type
  std::uint32_t fileRulesPerDomain = 1048576;
};

struct LabelSpace {
  std::vector<std::string> predefined;
  // Labels whose values are invalid until they are removed and added anew.
  std::vector<std::string> invalid;
};

struct TardiskWords {
  std::string launchDomain = "rootDom";
  std::string execEvent = "exec";
  std::string defaultLabel = "tardisk";
  std::string defaultDomain = "appDom";
};

struct ModuleDescription {
  ModuleLimits limits;
  std::string enforcementLevel = "enforcing";
  std::map<WordList, std::vector<std::string>> words;  // all lists but kObjects
  std::array<LabelSpace, 2> labels;                    // by LabelType
  std::vector<std::string> privilegedVms;
  std::map<WorldId, std::string> worlds;  // world to the name of the domain that it runs in
  TardiskWords tardisk;
};

}  // namespace StandIn
