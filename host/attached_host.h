// The machine that this process uses: what its kernel and its platform libraries are asked for.
#pragma once

#include <string>
#include <vector>

#include "host/image/root_index.h"
#include "host/module/security_module.h"
#include "host/trace/operation_point.h"

namespace StandIn {

// What the access library and the gate answer from. Belongs to whoever entered the host.
struct AttachedHost {
  SecurityModule& module;       // every operation passes `point`
  const OperationPoint& point;  // for the operations that are not the module's
  SecurityModule& unobserved;   // for what an answer needs besides: no operation of its own
  RootIndex& files;
  // Directories from outside that are visible inside, by their paths without links.
  std::vector<std::string> visible = {};
};

// Makes `host` this process's machine; null for none. A process has one kernel, so this is the one
// thing here that is process-wide. Not to be called while another thread uses the machine.
void Attach(const AttachedHost* host) noexcept;

// The machine that was attached last; null when there is none.
const AttachedHost* Attached() noexcept;

}  // namespace StandIn
