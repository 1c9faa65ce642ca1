// A module whose state is kept in a host directory, without a change of root.
#pragma once

#include <string>

#include "host/kernel/proc_processes.h"
#include "host/module/description_json.h"
#include "host/module/simulated_module.h"
#include "host/state/state_keeper.h"
#include "host/trace/observed_module.h"
#include "tests/host/root/host_fixture.h"

namespace StandIn {

class KeptModule {
 public:
  explicit KeptModule(const HostDirectory& host)
      : file_(host), keeper_(file_, host.Ref().PathOf(kStateFile), simulated_) {
    point_.Add(keeper_);
  }

  void Create(const std::string& name) { observed_.CreateDomain(name, DomainOrigin::kPolicy); }

  StateKeeper& Keeper() { return keeper_; }
  SecurityModule& Module() { return observed_; }

  // The names of all domains in the order of their ids.
  std::string Domains() {
    std::string names;
    for (DomainId id = 0; id < 8; ++id) {
      const auto info = observed_.GetDomainInfo(id);
      if (info) names += (names.empty() ? "" : " ") + info->name;
    }
    return names;
  }

 private:
  ProcProcesses processes_;
  SimulatedModule simulated_{ReadDescription(DefaultDescriptionText(), "host.json"), processes_};
  StateFile file_;
  StateKeeper keeper_;
  OperationPoint point_;
  ObservedModule observed_{simulated_, point_};
};

}  // namespace StandIn
