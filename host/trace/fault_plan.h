// Refusals on demand.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "host/module/module_error.h"
#include "host/trace/operation_point.h"

namespace StandIn {

// How an operation is made to fail.
struct Fault {
  enum class Kind : std::uint8_t { kRefusal, kOutOfMemory };

  Operation operation;
  std::uint64_t call = 1;  // which call of the operation fails, from 1
  Kind kind = Kind::kRefusal;
  int number = 0;  // the refusal's errno; 0 for one that names none
  // The private call's status, where it is not to follow from `number`.
  std::optional<long> status = std::nullopt;
};

// A fault from "OPERATION" or "OPERATION:N", the N-th call; it refuses with EIO. Throws
// std::invalid_argument with a text for the person who wrote it.
Fault ParseFault(const std::string& text);

// The refusal that a fault makes.
class InjectedRefusal final : public ModuleError {
 public:
  InjectedRefusal(const Fault& fault, const std::string& text)
      : ModuleError(fault.number, text), status_(fault.status) {}

  [[nodiscard]] const std::optional<long>& Status() const noexcept { return status_; }

 private:
  std::optional<long> status_;
};

// Counts the calls of each operation and makes those fail that were asked for: with an
// InjectedRefusal "refused on request: OPERATION, call N", or with std::bad_alloc. The operation
// itself is then not carried out.
class FaultPlan final : public OperationHook {
 public:
  void Add(const Fault& fault) { faults_.push_back(fault); }

  void Around(const OperationCall& call, const Callable<void>& proceed) override;

 private:
  std::vector<Fault> faults_;
  std::array<std::uint64_t, kOperations.size()> calls_{};
};

}  // namespace StandIn
