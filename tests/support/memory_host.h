// A host in this process's memory.
#pragma once

#include <string>

#include "host/attached_host.h"
#include "host/module/simulated_module.h"
#include "host/root/image_index.h"
#include "host/trace/observed_module.h"
#include "host/trace/operation_point.h"

namespace SecPolicyTest {

// The one process that such a host knows.
class OneProcess final : public StandIn::ProcessTable {
 public:
  StandIn::ProcessIdentity Self() const override { return {1, 1}; }
  bool Runs(const StandIn::ProcessIdentity& process) const override { return process == Self(); }
};

// What the platform's classes answer from, without a directory or a root of its own; attached as
// long as this object lives. Private calls reach it only where the gate was entered. One at a time.
class MemoryHost {
 public:
  explicit MemoryHost(const StandIn::ModuleDescription& description);
  // The files of `index` lie below the directory `root`.
  MemoryHost(const StandIn::ModuleDescription& description, const StandIn::ImageIndex& index,
             const std::string& root);
  ~MemoryHost();
  MemoryHost(const MemoryHost&) = delete;
  MemoryHost& operator=(const MemoryHost&) = delete;

  [[nodiscard]] StandIn::SimulatedModule& Module() noexcept { return module_; }
  [[nodiscard]] const StandIn::AttachedHost& Host() const noexcept { return attached_; }

  // Surrounds every operation from here on; must outlive this object.
  void Add(StandIn::OperationHook& hook) { point_.Add(hook); }

 private:
  OneProcess processes_;
  StandIn::SimulatedModule module_;
  StandIn::OperationPoint point_;
  StandIn::ObservedModule observed_;
  StandIn::RootIndex files_;
  StandIn::AttachedHost attached_;
};

}  // namespace SecPolicyTest
