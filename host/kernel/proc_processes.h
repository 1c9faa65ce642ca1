// The processes of this machine.
#pragma once

#include "host/files/unique_fd.h"
#include "host/module/process_table.h"

namespace StandIn {

// Reads /proc through a descriptor, so that it still can after a change of the root directory.
// Where there is no /proc, start times are unknown, and a process is told by its id alone.
class ProcProcesses final : public ProcessTable {
 public:
  ProcProcesses();

  ProcessIdentity Self() const override;
  bool Runs(const ProcessIdentity& process) const override;

 private:
  // 0 when no such process runs.
  [[nodiscard]] std::uint64_t StartTime(pid_t pid) const;

  UniqueFd proc_;
};

}  // namespace StandIn
