// A machine whose kernel is new for every run.
#pragma once

#include <string>

#include "host/attached_host.h"
#include "host/module/process_table.h"
#include "host/module/simulated_module.h"
#include "host/trace/observed_module.h"
#include "tests/faults/journalled_module.h"

namespace SecPolicyFaults {

// Records each operation on the module and lets the campaign refuse it.
class OperationDoor final : public StandIn::OperationHook {
 public:
  void Around(const StandIn::OperationCall& call, const StandIn::Callable<void>& proceed) override;

  // Whether memory ran out in the middle of a list of changes, so that a part of it may be done.
  [[nodiscard]] bool HasBrokenOff() const noexcept { return brokenOff_; }

 private:
  bool brokenOff_ = false;
};

// What all kernels of a process have in common; the files are those of the host that it entered.
struct KernelSetting {
  StandIn::ModuleDescription description;
  const StandIn::ProcessTable& processes;
  const StandIn::AttachedHost& entered;
};

// Attached as long as it lives.
class Machine {
 public:
  explicit Machine(const KernelSetting& setting);
  ~Machine();
  Machine(const Machine&) = delete;
  Machine& operator=(const Machine&) = delete;

  [[nodiscard]] bool HasBrokenOff() const noexcept { return door_.HasBrokenOff(); }
  // What the kernel holds.
  [[nodiscard]] std::string State() const { return module_.Save(); }
  // What a new kernel holds once all changes that succeeded here are made to it.
  [[nodiscard]] std::string ReplayedState() const;

 private:
  const KernelSetting& setting_;
  StandIn::SimulatedModule module_;
  StandIn::JournalledModule journal_{module_};
  OperationDoor door_;
  StandIn::OperationPoint point_;
  StandIn::ObservedModule observed_{journal_, point_};
  StandIn::AttachedHost attached_;
};

}  // namespace SecPolicyFaults
