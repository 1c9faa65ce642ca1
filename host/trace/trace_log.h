// A line for every kernel operation.
#pragma once

#include <functional>
#include <string>

#include "host/trace/operation_point.h"

namespace StandIn {

// Writes each operation, once it has ended, as its name and its arguments in the words of policy
// files; a refused one with " ! " and the refusal behind.
//
//   set-rule appDom -s openat grant # line 4
//   create-domain appDom policy ! no slot is free for the domain "appDom": all 1024 are taken
class TraceLog final : public OperationHook {
 public:
  using Sink = std::function<void(const std::string& line)>;

  // `sink` gets each line without its end. Without one, nothing is traced.
  explicit TraceLog(Sink sink = nullptr) : sink_(std::move(sink)) {}

  void Around(const OperationCall& call, const Callable<void>& proceed) override;

 private:
  Sink sink_;
};

}  // namespace StandIn
