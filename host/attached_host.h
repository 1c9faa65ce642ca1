// The kernel that code of this process talks to, and what belongs to it.
#pragma once

#include <string>
#include <vector>

#include "host/module/security_module.h"
#include "host/root/root_index.h"
#include "host/trace/operation_point.h"

namespace StandIn {

// What the access library, the gate and the library's doors answer from. Belongs to whoever opened
// the kernel or entered the host.
struct AttachedHost {
  SecurityModule& module;       // every operation passes `point`
  const OperationPoint& point;  // for the operations that are not the module's
  SecurityModule& unobserved;   // for what an answer needs besides: no operation of its own
  RootIndex& files;
  // Directories from outside that are visible inside, by their paths without links.
  std::vector<std::string> visible = {};
};

// Makes `host` this process's machine; null for none. Not to be called while another thread uses
// the machine.
void Attach(const AttachedHost* host) noexcept;

// While it lives, its thread uses `host` in place of the process's machine. Nested uses end in
// reverse order, in the thread that began them.
class ThreadAttachment {
 public:
  explicit ThreadAttachment(const AttachedHost& host) noexcept;
  ~ThreadAttachment();
  ThreadAttachment(const ThreadAttachment&) = delete;
  ThreadAttachment& operator=(const ThreadAttachment&) = delete;

 private:
  const AttachedHost* before_;
};

// What this thread uses: its own machine, or else the process's; null when there is neither. Safe
// in signal handlers.
const AttachedHost* Attached() noexcept;

}  // namespace StandIn
