#include "bindings/c/child.h"

#include <sys/eventfd.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <system_error>

#include "bindings/c/child_state.h"
#include "bindings/c/failure.h"
#include "host/image/unique_fd.h"
#include "tools/policy/letter.h"

namespace SecPolicyC {

using SecPolicyTool::Letter;
using StandIn::UniqueFd;

namespace {

[[noreturn]] void ThrowSystemError(const char* call) {
  throw std::system_error(errno, std::generic_category(), call);
}

// Tells, by a mark that a child leaves, whether it began its work.
class Beginning {
 public:
  Beginning() : fd_(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
    if (fd_.Get() < 0) ThrowSystemError("eventfd");
  }

  void Mark() const noexcept { static_cast<void>(eventfd_write(fd_.Get(), 1)); }
  [[nodiscard]] bool IsMarked() const {
    eventfd_t count = 0;
    return eventfd_read(fd_.Get(), &count) == 0;
  }

 private:
  UniqueFd fd_;
};

// All signals wait, from before the fork until the child has none of the caller's handlers left.
class SignalsBlocked {
 public:
  SignalsBlocked() {
    sigset_t all;
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &before_);
  }
  ~SignalsBlocked() { pthread_sigmask(SIG_SETMASK, &before_, nullptr); }
  SignalsBlocked(const SignalsBlocked&) = delete;
  SignalsBlocked& operator=(const SignalsBlocked&) = delete;

 private:
  sigset_t before_{};
};

// The first field says which of the two the others are.
constexpr char kResult[] = "result";
constexpr char kFailure[] = "failure";

Fields ToFields(const Failure& failure) {
  return {kFailure, std::to_string(failure.status), failure.message, failure.file,
          std::to_string(failure.line)};
}

[[noreturn]] void ThrowFailure(const Fields& fields) {
  throw Failure(static_cast<secpolicy_status>(std::stoi(fields.at(1))), fields.at(2), fields.at(3),
                static_cast<std::uint32_t>(std::stoul(fields.at(4))));
}

// The child's answer. A failure, lack of memory for the answer included, is one too, if only it
// can be written.
void Answer(const std::function<Fields()>& work, const Letter& letter) {
  try {
    Fields fields = work();
    fields.insert(fields.begin(), kResult);
    letter.WriteBytes(BytesOf(fields));
  } catch (...) {
    letter.WriteBytes(BytesOf(ToFields(CurrentFailure())));
  }
}

[[noreturn]] void BeChild(const std::function<Fields()>& work, const Letter& letter,
                          const Beginning& beginning, std::chrono::milliseconds patience) noexcept {
  try {
    TakeDefaultSignals();
    TakeFreeLocks(patience);
    beginning.Mark();
    Answer(
        [&] {
          TakeOwnDescriptors({letter.Descriptor()});
          return work();
        },
        letter);
  } catch (...) {
    _exit(EXIT_FAILURE);
  }
  // What the caller registered for its own end, and what its streams still hold, stays its own.
  _exit(EXIT_SUCCESS);
}

// The wait status of a child that has ended; nothing when somebody else asked for it first, or the
// process ignores SIGCHLD: the child has ended then, too.
std::optional<int> WaitFor(pid_t child) {
  int status = 0;
  while (waitpid(child, &status, 0) < 0) {
    if (errno != EINTR) return std::nullopt;
  }
  return status;
}

std::string EndText(const std::optional<int>& status) {
  if (!status || !WIFSIGNALED(*status)) return "the work came to no end";
  const char* name = sigdescr_np(WTERMSIG(*status));
  return std::string("the work was killed (") + (name == nullptr ? "unknown signal" : name) + ")";
}

Fields ResultIn(const Letter& letter, const std::optional<int>& status) {
  std::optional<Fields> fields = FieldsOf(letter.ReadBytes());
  if (!fields) throw Failure(SECPOLICY_SYSTEM, EndText(status));
  if (fields->front() == kFailure) ThrowFailure(*fields);
  fields->erase(fields->begin());
  return std::move(*fields);
}

// Nothing when the child found a lock taken, and was given up.
std::optional<Fields> Try(const std::function<Fields()>& work, std::chrono::milliseconds patience) {
  const Letter letter;
  const Beginning beginning;
  pid_t child = -1;
  {
    const SignalsBlocked blocked;
    child = fork();
    if (child == 0) BeChild(work, letter, beginning, patience);
    if (child < 0) ThrowSystemError("fork");
  }
  const std::optional<int> status = WaitFor(child);
  const bool isKilledByOthers = status && WIFSIGNALED(*status) && WTERMSIG(*status) != SIGALRM;
  if (!beginning.IsMarked() && !isKilledByOthers) return std::nullopt;
  return ResultIn(letter, status);
}

}  // namespace

Fields InChild(const std::function<Fields()>& work) {
  // Where threads do little else than to take such a lock, most children find it taken; on a
  // machine that is busy, one may be late without any. So they are many, and each gets more time.
  constexpr std::chrono::milliseconds kFirst{20};
  constexpr std::chrono::milliseconds kLast{1'000};
  for (auto patience = kFirst; patience < kLast; patience += kFirst) {
    if (auto result = Try(work, patience)) return std::move(*result);
  }
  throw Failure(SECPOLICY_SYSTEM,
                "no child can begin the work: another thread of this process keeps a lock of the C "
                "library");
}

}  // namespace SecPolicyC
