#include "tests/faults/machine.h"

#include <cerrno>
#include <new>

#include "host/module/module_error.h"
#include "tests/faults/doors.h"
#include "tests/support/counted_memory.h"

namespace SecPolicyFaults {

using SecPolicyTest::OwnMemory;
using StandIn::InfoOf;
using StandIn::ModuleError;

namespace {

std::string LineOf(const StandIn::OperationCall& call) {
  std::string line(InfoOf(call.operation).name);
  const std::string words = call.words();
  return words.empty() ? line : line + " " + words;
}

// Whether the operation is a list of changes, of which a part can be done.
bool IsList(StandIn::Operation operation) {
  switch (operation) {
    case StandIn::Operation::kAddLabels:
    case StandIn::Operation::kRemoveLabels:
    case StandIn::Operation::kAddFileRules:
    case StandIn::Operation::kReplacePath:
      return true;
    default:
      return false;
  }
}

[[noreturn]] void Refuse() {
  if (KindOfFault() == FaultKind::kOutOfMemory) throw std::bad_alloc();
  const OwnMemory ownMemory;
  throw ModuleError(EIO, kRefusalText);
}

void RecordOperation(EventKind kind, const StandIn::OperationCall& call) {
  const OwnMemory ownMemory;
  Record(kind, LineOf(call));
}

}  // namespace

void OperationDoor::Around(const StandIn::OperationCall& call,
                           const StandIn::Callable<void>& proceed) {
  RecordOperation(EventKind::kOperation, call);
  bool begun = false;
  try {
    if (Pass(Door::kOperation) != Verdict::kPass) Refuse();
    begun = true;
    const InsideKernel insideKernel;
    proceed();
  } catch (...) {
    brokenOff_ |= begun && IsList(call.operation) && SecPolicyTest::AllocationFailed();
    RecordOperation(EventKind::kRefused, call);
    throw;
  }
}

Machine::Machine(const KernelSetting& setting)
    : setting_(setting),
      module_(setting.description, setting.processes),
      attached_{observed_, point_, module_, setting.entered.files, setting.entered.visible} {
  point_.Add(door_);
  StandIn::Attach(&attached_);
}

Machine::~Machine() { StandIn::Attach(nullptr); }

std::string Machine::ReplayedState() const {
  StandIn::SimulatedModule module(setting_.description, setting_.processes);
  journal_.Replay(module);
  return module.Save();
}

}  // namespace SecPolicyFaults
