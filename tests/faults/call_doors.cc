#include "tests/faults/call_doors.h"

#include <sys/syscall.h>

#include <cerrno>
#include <csignal>
#include <string>

#include "host/gate/trapped_call.h"
#include "platform/private_calls.h"
#include "tests/faults/doors.h"
#include "tests/support/counted_memory.h"

namespace SecPolicyFaults {

namespace {

struct sigaction host {};

struct OrdinaryCall {
  long number;
  const char* name;
  Door door;
  unsigned int path;  // which argument is a path
};

constexpr OrdinaryCall kOrdinaryCalls[] = {
    {SYS_prctl, "prctl", Door::kResolvePath, 1},
    {SYS_setxattr, "setxattr", Door::kSetAttribute, 0},
    {SYS_getxattr, "getxattr", Door::kGetAttribute, 0},
};

long StatusOf(FaultKind kind) {
  switch (kind) {
    case FaultKind::kTooSmall:
      return ZekCtl::Kernel::kStatusTableTooSmall;
    case FaultKind::kStatusOne:
      return 1;
    case FaultKind::kBareStatus:
      return 0x0bad0000;
    case FaultKind::kWideStatus:
      return 1L << 32;
    case FaultKind::kNegativeStatus:
      return -4096;
    case FaultKind::kOrdinaryStatus:
      return -ENOSYS;
    default:
      return 0x0bad0005;
  }
}

void Refuse(StandIn::TrappedCall& call, Door door) {
  if (door != Door::kPrivateCall) return call.SetResult(-EIO);
  const FaultKind kind = KindOfFault();
  call.SetResult(StatusOf(kind));
  // An ordinary kernel leaves the second register as it is.
  if (kind == FaultKind::kOrdinaryStatus) return;
  call.SetSecondResult(kind == FaultKind::kSilentCall ? 0 : -EIO);
}

Door RecordCall(const StandIn::TrappedCall& call) {
  const SecPolicyTest::OwnMemory ownMemory;
  for (const OrdinaryCall& ordinary : kOrdinaryCalls) {
    if (call.Number() != ordinary.number) continue;
    Record(EventKind::kCall, ordinary.name,
           reinterpret_cast<const char*>(call.Argument(ordinary.path)));
    return ordinary.door;
  }
  Record(EventKind::kCall, "private", std::to_string(call.Number()));
  return Door::kPrivateCall;
}

void OnTrap(int signal, siginfo_t* info, void* context) {
  StandIn::TrappedCall call(*static_cast<ucontext_t*>(context));
  if (!IsWatched()) return host.sa_sigaction(signal, info, context);
  const int savedErrno = errno;
  const Door door = RecordCall(call);
  if (Pass(door) != Verdict::kPass) {
    Refuse(call, door);
  } else {
    const InsideKernel insideKernel;
    host.sa_sigaction(signal, info, context);
  }
  Record(EventKind::kCallEnd, "");
  errno = savedErrno;
}

}  // namespace

void WatchCalls() {
  struct sigaction action {};
  sigaction(SIGSYS, nullptr, &host);
  action.sa_sigaction = OnTrap;
  action.sa_flags = host.sa_flags;
  action.sa_mask = host.sa_mask;
  sigaction(SIGSYS, &action, nullptr);
}

}  // namespace SecPolicyFaults
