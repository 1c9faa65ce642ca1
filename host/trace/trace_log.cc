#include "host/trace/trace_log.h"

#include <exception>

namespace StandIn {

namespace {

std::string LineOf(const OperationCall& call) {
  std::string line(InfoOf(call.operation).name);
  const std::string words = call.words();
  return words.empty() ? line : line + " " + words;
}

}  // namespace

void TraceLog::Around(const OperationCall& call, const Callable<void>& proceed) {
  if (!sink_) return proceed();
  // Before the operation: it may end what its words are read from.
  const std::string line = LineOf(call);
  try {
    proceed();
  } catch (const std::exception& refusal) {
    sink_(line + " ! " + refusal.what());
    throw;
  }
  sink_(line);
}

}  // namespace StandIn
