#include "host/gate/gate.h"

#include <linux/seccomp.h>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstring>

#include "host/gate/ordinary_call_answers.h"
#include "host/gate/passthrough.h"
#include "host/gate/trap_filter.h"
#include "host/gate/trapped_call.h"
#include "host/gate/user_memory.h"
#include "host/kernel/private_call_answers.h"
#include "host/trace/thread_occupation.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

namespace {

using ZekCtl::Kernel::PrivateCall;

// A private number without a meaning: answered as an unknown call, and counted.
constexpr long kUnnamedCall = static_cast<long>(PrivateCall::kAddRules) + 1;

volatile std::sig_atomic_t trappedCalls = 0;
bool entered = false;

CallArguments ArgumentsOf(const TrappedCall& call) {
  CallArguments arguments;
  for (unsigned int i = 0; i < arguments.size(); ++i) arguments[i] = call.Argument(i);
  return arguments;
}

void AnswerPrivate(const AttachedHost* host, TrappedCall& call) {
  if (host == nullptr) return call.SetResult(-ENOSYS);
  UserMemory memory;
  const PrivateAnswer answer = AnswerPrivateCall(*host, call.Number(), ArgumentsOf(call), memory);
  call.SetResult(answer.status);
  call.SetSecondResult(answer.error);
}

long AnswerOrdinary(const AttachedHost* host, long number, const CallArguments& arguments) {
  if (host == nullptr) return SecpolicyGatePassThrough(number, arguments.data());
  switch (number) {
    case SYS_prctl:
      return AnswerResolvePath(*host, arguments);
    case SYS_setxattr:
      return AnswerSetAttribute(*host, arguments);
    case SYS_getxattr:
      return AnswerGetAttribute(*host, arguments);
    default:
      return -ENOSYS;
  }
}

void Answer(const AttachedHost* host, TrappedCall& call) {
  if (IsPrivateCall(call.Number())) return AnswerPrivate(host, call);
  call.SetResult(AnswerOrdinary(host, call.Number(), ArgumentsOf(call)));
}

// A call from a signal handler that interrupted an operation of its own thread. The operation holds
// the lock, and the allocator may have been interrupted: so nothing is done but to refuse.
void AnswerInterrupting(const AttachedHost* host, TrappedCall& call) {
  const CallArguments arguments = ArgumentsOf(call);
  if (IsPrivateCall(call.Number())) {
    const PrivateAnswer answer = Refusal(EDEADLK);
    call.SetResult(answer.status);
    call.SetSecondResult(answer.error);
  } else if (host == nullptr || !ConcernsModule(call.Number(), arguments)) {
    call.SetResult(SecpolicyGatePassThrough(call.Number(), arguments.data()));
  } else {
    call.SetResult(-EDEADLK);
  }
}

// Runs in the thread that made the call, at the call: what it interrupts is the caller's own code
// at a point of its choosing, never the allocator or this process's libraries half-way, so it may
// do what an ordinary function may. A caller that is itself a signal handler answers for what it
// has interrupted, except for an operation, which is noticed.
void OnTrap(int, siginfo_t*, void* context) {
  const int savedErrno = errno;
  trappedCalls = trappedCalls + 1;
  TrappedCall call(*static_cast<ucontext_t*>(context));
  const AttachedHost* host = Attached();
  if (IsThreadOccupied()) {
    AnswerInterrupting(host, call);
  } else {
    const AnswerScope scope;
    Answer(host, call);
  }
  errno = savedErrno;
}

[[noreturn]] void Refuse(const char* what) {
  throw HostError(std::string("the gate to the kernel cannot be entered: ") + what + ": " +
                  std::strerror(errno));
}

void InstallHandler() {
  struct sigaction action {};
  action.sa_sigaction = OnTrap;
  // A handler's own calls may be trapped in their turn.
  action.sa_flags = SA_SIGINFO | SA_NODEFER;
  sigemptyset(&action.sa_mask);
  if (sigaction(SIGSYS, &action, nullptr) != 0) Refuse("sigaction");
  sigset_t signals;
  sigemptyset(&signals);
  sigaddset(&signals, SIGSYS);
  if (sigprocmask(SIG_UNBLOCK, &signals, nullptr) != 0) Refuse("sigprocmask");
}

void InstallFilter() {
  std::vector<sock_filter> filter =
      BuildTrapFilter(OwnCode(), reinterpret_cast<std::uint64_t>(kSecpolicyGatePassThroughReturn));
  const sock_fprog program{static_cast<unsigned short>(filter.size()), filter.data()};
  if (prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0) != 0) Refuse("no_new_privs");
  // All threads get the filter, since all of them share the attached host.
  if (syscall(SYS_seccomp, SECCOMP_SET_MODE_FILTER, SECCOMP_FILTER_FLAG_TSYNC, &program) != 0) {
    Refuse("seccomp");
  }
}

void CheckThatCallsAreTrapped() {
  const auto before = trappedCalls;
  syscall(kUnnamedCall);
  if (trappedCalls == before) {
    throw HostError(
        "the gate to the kernel does not work here: system calls are not trapped, as under an "
        "emulator that answers unknown ones itself (valgrind does)");
  }
}

}  // namespace

void EnterGate() {
  if (entered) return;
  InstallHandler();
  InstallFilter();
  CheckThatCallsAreTrapped();
  entered = true;
}

}  // namespace StandIn
