// What is documented of the private system calls, call by call.
#pragma once

#include <cstddef>
#include <cstdint>

#include "host/kernel/private_call_answers.h"
#include "platform/private_calls.h"

namespace Fuzz {

// Fails unless the answer is one that the call may give.
void RequireDocumented(ZekCtl::Kernel::PrivateCall call, const StandIn::PrivateAnswer& answer);

// Where a call writes: a range and a cell of 4 bytes.
struct Results {
  std::uint64_t address = 0;
  std::size_t size = 0;
  std::uint64_t cell = 0;
};

// That of a call in the small world.
Results ResultsOf(ZekCtl::Kernel::PrivateCall call, const StandIn::CallArguments& arguments);

}  // namespace Fuzz
