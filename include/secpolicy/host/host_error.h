// What is wrong with a host directory, or with the machine it is to be entered on.
#pragma once

#include <stdexcept>
#include <string>

namespace StandIn {

// Thrown when a host directory, a file of it, an archive, or this machine's own facilities do not
// allow what was asked. `what()` names the file and the place in it. Nothing was changed.
class [[gnu::visibility("default")]] HostError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

}  // namespace StandIn
