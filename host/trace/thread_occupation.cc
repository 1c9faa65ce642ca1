#include "host/trace/thread_occupation.h"

#include <cerrno>

#include "host/module/module_error.h"

namespace StandIn {

namespace {

// Of a thread, and reached without a call that could allocate. Volatile for signal handlers.
[[gnu::tls_model("initial-exec")]] thread_local volatile bool isOperating = false;
[[gnu::tls_model("initial-exec")]] thread_local volatile bool isAnswering = false;

}  // namespace

OperationScope::OperationScope() {
  if (isOperating) {
    throw ModuleError(EDEADLK, "the kernel was asked again while it carries out an operation");
  }
  isOperating = true;
}

OperationScope::~OperationScope() { isOperating = false; }

AnswerScope::AnswerScope() noexcept { isAnswering = true; }

AnswerScope::~AnswerScope() { isAnswering = false; }

bool IsThreadOccupied() noexcept { return isOperating || isAnswering; }

}  // namespace StandIn
