#include "tests/crash/traced_process.h"

#include <signal.h>
#include <sys/ptrace.h>
#include <sys/uio.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <stdexcept>

namespace CrashTest {

namespace {

constexpr int kCallStop = SIGTRAP | 0x80;
constexpr long kOptions = PTRACE_O_TRACESYSGOOD | PTRACE_O_TRACEFORK | PTRACE_O_TRACEVFORK |
                          PTRACE_O_TRACECLONE | PTRACE_O_TRACEEXEC | PTRACE_O_EXITKILL;

// The request's arguments are pointers or numbers, as the case may be.
template <typename Data>
long Trace(__ptrace_request request, pid_t process, Data data) {
  return ptrace(request, process, nullptr, data);
}

}  // namespace

std::string PendingCall::TextAt(std::uint64_t address) const {
  std::array<char, 255> text;
  iovec here{text.data(), text.size()};
  iovec there{reinterpret_cast<void*>(address), text.size()};
  const ssize_t size = process_vm_readv(process, &here, 1, &there, 1, 0);
  if (size <= 0) return {};
  return {text.begin(), std::find(text.begin(), text.begin() + size, '\0')};
}

bool TracedProcess::IsPermitted() {
  const pid_t child = fork();
  if (child == 0) _exit(ptrace(PTRACE_TRACEME, 0, nullptr, nullptr) == 0 ? 0 : 1);
  int status = 0;
  return waitpid(child, &status, 0) == child && WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

TracedProcess::TracedProcess(const std::function<void()>& body) {
  std::fflush(nullptr);
  first_ = fork();
  if (first_ < 0) throw std::runtime_error("cannot fork");
  if (first_ == 0) {
    setpgid(0, 0);
    ptrace(PTRACE_TRACEME, 0, nullptr, nullptr);
    raise(SIGSTOP);
    body();
    _exit(126);
  }
  int status = 0;
  waitpid(first_, &status, 0);
  if (!WIFSTOPPED(status) || Trace(PTRACE_SETOPTIONS, first_, kOptions) != 0) {
    kill(first_, SIGKILL);
    throw std::runtime_error("cannot trace");
  }
  running_.insert(first_);
  waiting_ = first_;
}

void TracedProcess::Resume(pid_t process, int signal) {
  Trace(PTRACE_SYSCALL, process, static_cast<long>(signal));
}

bool TracedProcess::Take(pid_t process, int status, PendingCall& call) {
  if (!WIFSTOPPED(status)) {
    running_.erase(process);
    if (process == first_) status_ = status;
    return false;
  }
  const int signal = WSTOPSIG(status);
  const bool isNew = running_.insert(process).second;
  if (signal != kCallStop) {
    // An event of the tracing, and a new process's first stop, are no signals of its own.
    Resume(process, (status >> 16) != 0 || (isNew && signal == SIGSTOP) ? 0 : signal);
    return false;
  }
  __ptrace_syscall_info info{};
  ptrace(PTRACE_GET_SYSCALL_INFO, process, sizeof info, &info);
  if (info.op != PTRACE_SYSCALL_INFO_ENTRY) {
    Resume(process, 0);
    return false;
  }
  call.process = process;
  call.number = info.entry.nr;
  std::copy(std::begin(info.entry.args), std::end(info.entry.args), call.arguments.begin());
  return true;
}

std::optional<PendingCall> TracedProcess::NextCall() {
  if (waiting_) Resume(*waiting_, 0);
  waiting_.reset();
  while (!running_.empty()) {
    int status = 0;
    const pid_t process = waitpid(-first_, &status, __WALL);
    if (process < 0 && errno == EINTR) continue;
    if (process < 0) break;
    PendingCall call;
    if (Take(process, status, call)) {
      waiting_ = process;
      return call;
    }
  }
  return std::nullopt;
}

void TracedProcess::Finish() {
  while (NextCall()) continue;
}

void TracedProcess::KillWaiting() const {
  if (waiting_) kill(*waiting_, SIGKILL);
}

// By their group, in which also those are that have not stopped yet.
void TracedProcess::Kill() {
  if (running_.empty()) return;
  kill(-first_, SIGKILL);
  int status = 0;
  for (;;) {
    const pid_t process = waitpid(-first_, &status, __WALL);
    if (process < 0 && errno != EINTR) break;
    if (process == first_ && !WIFSTOPPED(status)) status_ = status;
  }
  running_.clear();
  waiting_.reset();
}

int TracedProcess::ExitStatus() const { return WIFEXITED(status_) ? WEXITSTATUS(status_) : -1; }

}  // namespace CrashTest
