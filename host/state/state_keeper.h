// The module's state, kept on disk across operations and processes.
#pragma once

#include <optional>
#include <string>

#include "host/module/storable_module.h"
#include "host/state/state_file.h"
#include "host/trace/operation_point.h"

namespace StandIn {

// Surrounds each operation: takes the lock for a change, reads what other processes wrote since,
// and writes what the operation changed, so that an operation that reported success is kept and
// those of several processes follow one another as in one kernel. An operation whose change cannot
// be written is refused with EIO and changes nothing.
class StateKeeper final : public OperationHook {
 public:
  // `file` and `module` must outlive this object; `path` is what messages call the file. What
  // `module` holds now is what it holds when there is no file.
  StateKeeper(StateFile& file, std::string path, StorableModule& module);

  // Takes over what the file holds. Throws HostError when it is damaged or cannot be read.
  void Refresh();

  void Around(const OperationCall& call, const Callable<void>& proceed) override;

  // Holds the lock, and writes once for all operations until Commit: what happens in between
  // happens at one moment for other processes. Throws HostError, nothing begun, as Refresh does.
  void BeginBatch();

  // Writes what the batch changed and gives the lock up. Throws HostError when it cannot be
  // written: the file is then as it was, and the changes are lost. Does nothing without a batch.
  void Commit();

 private:
  void Guarded(const Callable<void>& proceed);
  void Write();

  StateFile& file_;
  std::string path_;
  StorableModule& module_;
  std::string initial_;
  std::optional<StateFile::Version> version_;
  std::optional<StateFile::Lock> batch_;
  bool changedInBatch_ = false;
};

}  // namespace StandIn
