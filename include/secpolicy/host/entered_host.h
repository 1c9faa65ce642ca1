// The stand-in host, for programs that use the library without a target: a process enters a host
// directory, and from there on the library's calls are answered by that host.
//
//     const StandIn::EnteredHost host("/var/tmp/host");
//     SecPolicy::LoadPolicy("/etc/olvane/secpolicy");
//
// The host directory is one that "secpolicy host init" made and "secpolicy host assemble" filled;
// the policy's path is one inside the host.
#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "host_error.h"

#pragma GCC visibility push(default)

namespace StandIn {

class Session;

// What a process may ask for besides when it enters a host.
struct EnterOptions {
  // Directories outside the host that are to be found inside under the same absolute paths: a
  // policy directory that lies outside, for one.
  std::vector<std::string> visible = {};
  // Gets a line, without its end, for each operation on the kernel, once it has ended.
  std::function<void(const std::string& line)> trace = nullptr;
  // Operations that the kernel is to refuse: "OPERATION", or "OPERATION:N" for its N-th call.
  std::vector<std::string> faults = {};
  // Which kernel the process has. All but kKept are the process's own and are forgotten with it:
  // what is loaded into them changes nothing on disk.
  enum class Kernel {
    kKept,      // the host's own
    kSnapshot,  // one that holds what the host's does at this moment
    kScratch,   // one that has just been started
  };
  Kernel kernel = Kernel::kKept;  // the process's
};

// This process's use of a host. Entering changes the process for good: its root directory is the
// host's, and a filter for system calls stays. So enter in a process made for it, which has one
// thread, enters one host once, and starts no other program, since that would be killed at its
// first private call. As an ordinary user the process gets a user namespace of its own.
//
// Files of the outer file system that are open stay open; a log that opens its connection later
// (syslog without openlog and LOG_NDELAY) does not find it.
class EnteredHost {
 public:
  // Enters the host directory `dir`. Throws HostError when it is damaged, has not been assembled,
  // or cannot be entered here, and std::invalid_argument for a fault that names no operation. After
  // a HostError the root directory may have changed already.
  explicit EnteredHost(const std::string& dir, const EnterOptions& options = {});
  // Without it no host answers: the calls fail as on a kernel that has no security module.
  ~EnteredHost();
  EnteredHost(const EnteredHost&) = delete;
  EnteredHost& operator=(const EnteredHost&) = delete;

  // Each operation on the kernel is kept on disk before it reports success. From here to Commit,
  // they are kept together instead, which is faster and holds the host's lock; a process that ends
  // without Commit loses them. Nothing is done where the kernel is not kept. Throws HostError,
  // nothing begun, when the lock cannot be had or the kernel's state is damaged.
  void BeginBatch();
  // Keeps what the batch did; nothing without one. Throws HostError when that cannot be written: it
  // is then lost.
  void Commit();

 private:
  std::unique_ptr<Session> session_;
};

}  // namespace StandIn

#pragma GCC visibility pop
