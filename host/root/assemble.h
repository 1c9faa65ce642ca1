// Making the root file system of a host out of its archives.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "host/archives/unpack_budget.h"
#include "host/state/host_directory.h"

namespace StandIn {

struct AssembleReport {
  struct Tardisk {
    std::string name;
    std::uint64_t entries = 0;
  };
  std::vector<Tardisk> tardisks;  // in the order in which they were unpacked
  std::uint64_t entries = 0;      // of all
};

// Unpacks the archives in tardisks/, in byte order of their names, into a new root/, adds the
// archives themselves as root/tardisks/NAME (hard links where the file system allows it, else
// copies), and writes image.json. Since a new image is a new start of the machine, kernel.json is
// removed. Waits for the exclusive lock of the host and holds it throughout.
//
// Nothing outside the host directory is read or written whatever the archives hold. Throws
// HostError: those of Unpack, with DIR/tardisks/NAME as the archive's path, and
//   "DIR/tardisks: not a regular file: "NAME", ..."   archives can only be regular files
//   "FILE: cannot be DONE: REASON"
// The host is then as it was before; only when exchanging the directories or writing image.json
// itself failed, it has no image.json and has to be assembled anew. Whenever this process ends
// half-way, it either is as before or has no image.json; what is left of root.new goes with the
// next call. So does an old root file system that could not be removed.
AssembleReport Assemble(const HostDirectory& host, const UnpackLimits& limits = {});

}  // namespace StandIn
