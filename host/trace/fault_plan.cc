#include "host/trace/fault_plan.h"

#include <cerrno>
#include <charconv>
#include <new>
#include <stdexcept>

namespace StandIn {

namespace {

std::uint64_t ParseCall(std::string_view text) {
  std::uint64_t call = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), call);
  if (error != std::errc() || end != text.data() + text.size() || call == 0) {
    throw std::invalid_argument("not the number of a call: \"" + std::string(text) + "\"");
  }
  return call;
}

[[noreturn]] void Fail(const Fault& fault) {
  if (fault.kind == Fault::Kind::kOutOfMemory) throw std::bad_alloc();
  throw InjectedRefusal(fault, "refused on request: " + std::string(InfoOf(fault.operation).name) +
                                   ", call " + std::to_string(fault.call));
}

}  // namespace

Fault ParseFault(const std::string& text) {
  const std::string_view view = text;
  const std::string_view name = view.substr(0, view.find(':'));
  const auto operation = FindOperation(name);
  if (!operation) {
    throw std::invalid_argument("no kernel operation is named \"" + std::string(name) + "\"");
  }
  Fault fault{.operation = *operation, .number = EIO};
  if (name.size() != view.size()) fault.call = ParseCall(view.substr(name.size() + 1));
  return fault;
}

void FaultPlan::Around(const OperationCall& call, const Callable<void>& proceed) {
  const std::uint64_t number = ++calls_[static_cast<std::size_t>(call.operation)];
  for (const Fault& fault : faults_) {
    if (fault.operation == call.operation && fault.call == number) Fail(fault);
  }
  proceed();
}

}  // namespace StandIn
