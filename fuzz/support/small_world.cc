#include "fuzz/support/small_world.h"

#include "host/module/description_json.h"

namespace Fuzz {

namespace {

constexpr char kText[] = R"({
  "format": 1,
  "limits": {"domains": 6, "labels": 12, "fileRulesPerDomain": 8},
  "words": {"capabilities": ["kill", "chown"], "paramCapabilities": ["net_bind"],
            "objectAccesses": ["read", "write"], "transitionEvents": ["exec"],
            "fileTypes": ["file", "dir"], "socketTypes": ["stream"],
            "systemCalls": ["read", "openat", "close"]},
  "labels": {"object": {"predefined": ["default", "tardisk"], "invalid": []}},
  "worlds": [{"id": 7, "domain": "netDom"}]
})";

}  // namespace

const StandIn::ModuleDescription& SmallDescription() {
  static const StandIn::ModuleDescription description =
      StandIn::ReadDescription(kText, "host.json");
  return description;
}

void Populate(StandIn::SecurityModule& module) {
  for (const std::string& domain : kSmallDomains) {
    if (!module.FindDomain(domain)) module.CreateDomain(domain, StandIn::DomainOrigin::kPolicy);
  }
  module.AddLabels(kSmallObjects, StandIn::LabelType::kObject);
}

}  // namespace Fuzz
