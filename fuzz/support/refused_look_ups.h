// A kernel that refuses to look a label up, so that nothing on this machine is labelled.
#pragma once

#include <cerrno>

#include "host/module/module_error.h"
#include "host/trace/operation_point.h"

namespace Fuzz {

// Names the label in its refusal.
class RefusedLookUps final : public StandIn::OperationHook {
 public:
  void Around(const StandIn::OperationCall& call, const StandIn::Callable<void>& proceed) override {
    if (call.operation == StandIn::Operation::kLookupLabel) {
      throw StandIn::ModuleError(EIO, "asked for " + call.words());
    }
    proceed();
  }
};

}  // namespace Fuzz
