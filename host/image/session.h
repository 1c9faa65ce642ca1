// The use of a host by this process.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "host/attached_host.h"
#include "host/image/host_directory.h"
#include "host/image/proc_processes.h"
#include "host/image/root_index.h"
#include "host/image/state_file.h"
#include "host/image/state_keeper.h"
#include "host/module/simulated_module.h"
#include "host/trace/fault_plan.h"
#include "host/trace/observed_module.h"
#include "host/trace/trace_log.h"
#include "secpolicy/host/entered_host.h"

namespace StandIn {

struct SessionOptions {
  // Directories outside the host that are to be found inside under the same absolute paths.
  std::vector<std::string> visible;
  TraceLog::Sink trace;
  std::vector<Fault> faults;
  using Kernel = EnterOptions::Kernel;
  Kernel kernel = Kernel::kKept;
};

// Turns this process into a process of the host: its root file system is the host's, its kernel has
// the host's security module, and the platform's libraries answer for both. That cannot be undone:
// enter a host in a process made for it, which starts no other program (see host/gate/gate.h). One
// session a process.
//
// Each operation on the module is kept before it reports success (see state_keeper.h), unless a
// batch keeps many at once, or the kernel is the process's own.
class Session {
 public:
  // Throws HostError when the host is damaged, has not been assembled, or cannot be entered here.
  Session(HostDirectory host, const SessionOptions& options);
  ~Session();
  Session(const Session&) = delete;
  Session& operator=(const Session&) = delete;

  // From here to Commit, operations are kept together; see StateKeeper. A process that ends without
  // Commit loses what the batch did. Nothing is done where nothing is kept.
  void BeginBatch() {
    if (isKept_) keeper_.BeginBatch();
  }
  void Commit() { keeper_.Commit(); }

  // The module behind all hooks, as the platform's libraries use it.
  [[nodiscard]] SecurityModule& Module() { return observed_; }

 private:
  HostDirectory host_;
  bool isKept_;
  ProcProcesses processes_;
  SimulatedModule module_;
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
