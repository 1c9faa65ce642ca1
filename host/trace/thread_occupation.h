// What a thread is doing for the host, as the signal handlers that interrupt it have to know it.
#pragma once

namespace StandIn {

// While it lives, its thread is within an operation on the module. A second operation of the thread
// could only come from something that the first one calls or from a signal handler; it would wait
// for ever for the lock that the first one holds.
class OperationScope {
 public:
  // Throws ModuleError EDEADLK when the thread is within an operation already.
  OperationScope();
  ~OperationScope();
  OperationScope(const OperationScope&) = delete;
  OperationScope& operator=(const OperationScope&) = delete;
};

// While it lives, its thread is answering a trapped call, in or around an operation.
class AnswerScope {
 public:
  AnswerScope() noexcept;
  ~AnswerScope();
  AnswerScope(const AnswerScope&) = delete;
  AnswerScope& operator=(const AnswerScope&) = delete;
};

// Whether the thread is within either of them. Safe in signal handlers.
bool IsThreadOccupied() noexcept;

}  // namespace StandIn
