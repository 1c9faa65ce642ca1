#include "host/access/host_in_use.h"

namespace StandIn {

const AttachedHost& HostInUse() {
  const AttachedHost* host = Attached();
  if (host == nullptr) {
    throw Tavon::Lib::TavonException(
        "the kernel's security module cannot be reached: no host has been entered");
  }
  return *host;
}

}  // namespace StandIn
