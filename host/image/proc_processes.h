// The processes of this machine.
#pragma once

#include "host/image/unique_fd.h"
#include "host/module/process_table.h"

namespace StandIn {

// Reads /proc through a descriptor, so that it still can after a change of the root directory.
class ProcProcesses final : public ProcessTable {
 public:
  // Throws HostError when /proc cannot be opened.
  ProcProcesses();

  ProcessIdentity Self() const override;
  bool Runs(const ProcessIdentity& process) const override;

 private:
  // 0 when no such process runs.
  [[nodiscard]] std::uint64_t StartTime(pid_t pid) const;

  UniqueFd proc_;
};

}  // namespace StandIn
