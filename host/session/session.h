// The use of a host by this process.
#pragma once

#include <string>
#include <vector>

#include "host/kernel/kernel.h"

namespace StandIn {

struct SessionOptions {
  // Directories outside the host that are to be found inside under the same absolute paths.
  std::vector<std::string> visible;
  TraceLog::Sink trace = nullptr;
  std::vector<Fault> faults = {};
  using Kernel = EnterOptions::Kernel;
  Kernel kernel = Kernel::kKept;
};

// Turns this process into a process of the host: its root file system is the host's, its kernel has
// the host's security module, and the platform's libraries answer for both. That cannot be undone:
// enter a host in a process made for it, which starts no other program (see host/gate/gate.h). One
// session a process.
class Session {
 public:
  // Throws HostError when the host is damaged, has not been assembled, or cannot be entered here.
  Session(HostDirectory host, const SessionOptions& options);
  ~Session();
  Session(const Session&) = delete;
  Session& operator=(const Session&) = delete;

  // See Kernel. A process that ends without Commit loses what the batch did.
  void BeginBatch() { kernel_.BeginBatch(); }
  void Commit() { kernel_.Commit(); }

  // The module behind all hooks, as the platform's libraries use it.
  [[nodiscard]] SecurityModule& Module() { return kernel_.Module(); }

 private:
  Kernel kernel_;
  AttachedHost attached_;
};

}  // namespace StandIn
