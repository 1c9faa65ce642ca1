// Which processes run: what a kernel knows of itself and the module has to be told.
#pragma once

#include <sys/types.h>

#include <cstdint>

namespace StandIn {

// A process that cannot be mistaken for a later one with the same id.
struct ProcessIdentity {
  pid_t pid = 0;
  std::uint64_t startTime = 0;  // clock ticks since boot

  friend bool operator==(const ProcessIdentity&, const ProcessIdentity&) = default;
};

class ProcessTable {
 public:
  virtual ~ProcessTable() = default;

  // The process that asks.
  virtual ProcessIdentity Self() const = 0;
  virtual bool Runs(const ProcessIdentity& process) const = 0;
};

}  // namespace StandIn
