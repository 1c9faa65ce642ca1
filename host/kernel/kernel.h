// The kernel of a host, as an object.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "host/attached_host.h"
#include "host/kernel/proc_processes.h"
#include "host/module/storable_module.h"
#include "host/root/root_index.h"
#include "host/state/host_directory.h"
#include "host/state/state_file.h"
#include "host/state/state_keeper.h"
#include "host/trace/fault_plan.h"
#include "host/trace/observed_module.h"
#include "host/trace/trace_log.h"
#include "secpolicy/host/entered_host.h"

namespace StandIn {

struct KernelOptions {
  using State = EnterOptions::Kernel;
  // kKept: operations are kept in the host directory before they report success (see
  // state_keeper.h), unless a batch keeps many at once. The others change nothing on disk.
  State state = State::kKept;
  TraceLog::Sink trace = nullptr;  // of every operation
  std::vector<Fault> faults = {};
  // Surround every operation, within what keeps and traces it; they must outlive the kernel.
  std::vector<OperationHook*> hooks = {};
  // Whether a host is refused that has not been assembled; else its root is empty.
  enum class Root { kRequired, kOptional } root = Root::kRequired;
};

// Security module, root file system and trace of a host, in this process's memory. Opening it
// writes nothing and needs the right to read alone. One thread at a time uses it.
class Kernel {
 public:
  // Throws HostError when the host is damaged, or has not been assembled and has to be.
  Kernel(HostDirectory host, const KernelOptions& options);
  Kernel(const Kernel&) = delete;
  Kernel& operator=(const Kernel&) = delete;

  [[nodiscard]] const HostDirectory& Directory() const noexcept { return host_; }
  // The module as programs use it: every operation is traced, kept, and refused on request.
  [[nodiscard]] SecurityModule& Module() noexcept { return observed_; }
  // The module itself, for questions that are no operations of a program.
  [[nodiscard]] SecurityModule& Unobserved() noexcept { return *module_; }
  // An empty root where the host has not been assembled.
  [[nodiscard]] RootIndex& Files() noexcept { return files_; }
  [[nodiscard]] bool IsAssembled() const noexcept { return files_.Tree().Root() >= 0; }
  [[nodiscard]] const AttachedHost& Attachment() const noexcept { return attached_; }

  // From here to Commit, operations are kept together; see StateKeeper. Nothing is done where
  // nothing is kept.
  void BeginBatch() {
    if (isKept_) keeper_.BeginBatch();
  }
  void Commit() { keeper_.Commit(); }

 private:
  HostDirectory host_;
  bool isKept_;
  ProcProcesses processes_;
  std::unique_ptr<StorableModule> module_;
  StateFile file_;
  StateKeeper keeper_;
  TraceLog trace_;
  FaultPlan faults_;
  OperationPoint point_;
  ObservedModule observed_;
  RootIndex files_;
  AttachedHost attached_;
};

}  // namespace StandIn
