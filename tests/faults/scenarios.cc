#include "secpolicy/secpolicy.h"
#include "tests/faults/scenario_parts.h"

namespace SecPolicyFaults {

namespace {

constexpr char kSystemTardisks[] = "/etc/olvane/secpolicy/tardisks";

Scenario Load(const Text& name, HostKind host) {
  const Text dir = PolicyDirOf(host);
  return {.name = name,
          .host = host,
          .family = Family::kLoad,
          .run = Doing([dir] { SecPolicy::LoadPolicy(dir); }),
          .policyDir = dir};
}

Scenario Display(const Text& name, HostKind host, const Text& selector) {
  return {.name = name,
          .host = host,
          .family = Family::kDisplay,
          .prepare = Loaded(host),
          .run = Doing([selector] { SecPolicy::DisplayPolicy(selector); }),
          .policyDir = PolicyDirOf(host),
          .first = Phase::kDone};
}

template <typename Action>
Scenario DisplayPart(const Text& name, Action action) {
  Scenario scenario = Display(name, HostKind::kGood, "");
  scenario.run = WithInterface(action);
  return scenario;
}

struct StageRow {
  const char* name;
  void (*stage)(Text, ZekAccessInterfaceImpl&);
  const char* dir;
  Phase first;
  Phase behind;
};

constexpr StageRow kStages[] = {
    {"stage-objects", SecPolicy::LoadPolicyObjects, "/policy/objects", Phase::kObjectsRead,
     Phase::kDomainNames},
    {"stage-domains", SecPolicy::LoadPolicyDomains, "/policy/domains", Phase::kDomainNames,
     Phase::kWellKnown},
    {"stage-tardisks", SecPolicy::LoadPolicyTardisks, kSystemTardisks, Phase::kWellKnown,
     Phase::kLabelsParse},
    {"stage-labels", SecPolicy::LoadPolicyFileLabels, "/policy/fileLabels", Phase::kTardisksDefault,
     Phase::kDone},
};

Scenario StageOf(const StageRow& row) {
  return {.name = row.name,
          .family = Family::kStage,
          .prepare = Loaded(HostKind::kGood),
          .run = WithInterface([row](ZekAccessInterfaceImpl& iface) { row.stage(row.dir, iface); }),
          .policyDir = "/policy",
          .first = row.first,
          .behind = row.behind};
}

Scenario DefaultTardisks() {
  return {.name = "set-default-tardisk-policy",
          .family = Family::kStage,
          .prepare = Loaded(HostKind::kGood),
          .run = WithInterface([](ZekAccessInterfaceImpl& iface) {
            std::list<Text> tardisks{"/tardisks/plain.tar", "/tardisks/base.tar"};
            SecPolicy::SetDefaultTardiskPolicy(tardisks, iface);
          }),
          .policyDir = "/policy",
          .first = Phase::kTardisksDefault,
          .behind = Phase::kLabelsParse};
}

}  // namespace

std::vector<Scenario> AllScenarios() {
  std::vector<Scenario> all{
      Load("load", HostKind::kGood),
      Load("load-errors", HostKind::kBad),
      Load("load-example", HostKind::kExample),
      Display("display", HostKind::kGood, ""),
      Display("display-errors", HostKind::kBad, ""),
      Display("display-one-domain", HostKind::kGood, "1"),
  };
  for (const StageRow& row : kStages) all.push_back(StageOf(row));
  all.push_back(DefaultTardisks());
  all.push_back(DisplayPart("display-domain", [](ZekAccessInterfaceImpl& iface) {
    SecPolicy::DisplayDomainPolicy(iface, kAppDomain);
  }));
  all.push_back(DisplayPart("display-domains", [](ZekAccessInterfaceImpl& iface) {
    SecPolicy::DisplayPolicyDomains(iface, "");
  }));
  all.push_back(DisplayPart("display-objects", SecPolicy::DisplayPolicyObjects));
  all.push_back(DisplayPart("display-tardisks", SecPolicy::DisplayPolicyTardiskLabels));
  AddCallScenarios(all);
  return all;
}

}  // namespace SecPolicyFaults
