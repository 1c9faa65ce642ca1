// A kernel that resolves no path.
#pragma once

#include <cerrno>

#include "host/module/module_error.h"
#include "host/trace/operation_point.h"

namespace SecPolicyTest {

// Paths of rules are then kept as they are written, whatever this machine has.
class UnresolvedPaths final : public StandIn::OperationHook {
 public:
  void Around(const StandIn::OperationCall& call, const StandIn::Callable<void>& proceed) override {
    if (call.operation == StandIn::Operation::kResolvePath) {
      throw StandIn::ModuleError(ENOENT, "no path is resolved");
    }
    proceed();
  }
};

}  // namespace SecPolicyTest
