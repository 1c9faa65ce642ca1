#include "host/gate/trap_filter.h"

#include <linux/audit.h>
#include <linux/seccomp.h>
#include <sys/syscall.h>

#include <algorithm>
#include <cstddef>
#include <utility>

#include "platform/private_calls.h"

namespace StandIn {

namespace {

#if defined(__x86_64__)
constexpr std::uint32_t kArchitecture = AUDIT_ARCH_X86_64;
#elif defined(__aarch64__)
constexpr std::uint32_t kArchitecture = AUDIT_ARCH_AARCH64;
#endif

constexpr std::uint32_t High(std::uint64_t value) {
  return static_cast<std::uint32_t>(value >> 32);
}
constexpr std::uint32_t Low(std::uint64_t value) { return static_cast<std::uint32_t>(value); }

// Assembles a program. A condition skips instructions; the skips of a function below end at the
// function's end, so that whatever is not decided there falls through to the next.
class Program {
 public:
  void Load(std::size_t offset) {
    Emit(BPF_LD | BPF_W | BPF_ABS, static_cast<std::uint32_t>(offset));
  }
  void LoadLow(std::size_t offset) { Load(offset); }
  void LoadHigh(std::size_t offset) { Load(offset + sizeof(std::uint32_t)); }
  void Return(std::uint32_t action) { Emit(BPF_RET | BPF_K, action); }

  void SkipIfEqual(std::uint32_t value, std::uint8_t count) {
    Emit(BPF_JMP | BPF_JEQ, value, count, 0);
  }
  void SkipUnlessEqual(std::uint32_t value, std::uint8_t count) {
    Emit(BPF_JMP | BPF_JEQ, value, 0, count);
  }
  void SkipIfBelow(std::uint32_t value, std::uint8_t count) {
    Emit(BPF_JMP | BPF_JGE, value, 0, count);
  }
  void SkipIfAbove(std::uint32_t value, std::uint8_t count) {
    Emit(BPF_JMP | BPF_JGT, value, count, 0);
  }

  [[nodiscard]] std::vector<sock_filter> Take() { return std::move(instructions_); }

 private:
  void Emit(int code, std::uint32_t value, std::uint8_t ifTrue = 0, std::uint8_t ifFalse = 0) {
    instructions_.push_back({static_cast<std::uint16_t>(code | BPF_K), ifTrue, ifFalse, value});
  }

  std::vector<sock_filter> instructions_;
};

constexpr std::size_t kNumber = offsetof(seccomp_data, nr);
constexpr std::size_t kPlace = offsetof(seccomp_data, instruction_pointer);
constexpr std::size_t kFirstArgument = offsetof(seccomp_data, args);

// The filter compares words of 32 bits, so a range must not cross a multiple of 2^32.
std::vector<CodeRange> SplitAtHighWord(const std::vector<CodeRange>& ranges) {
  std::vector<CodeRange> split;
  for (CodeRange range : ranges) {
    while (range.begin < range.end) {
      const std::uint64_t end = std::min(range.end, (range.begin | 0xffffffffu) + 1);
      split.push_back({range.begin, end});
      range.begin = end;
    }
  }
  return split;
}

void LetByOtherArchitectures(Program& program) {
  program.Load(offsetof(seccomp_data, arch));
  program.SkipIfEqual(kArchitecture, 1);
  program.Return(SECCOMP_RET_ALLOW);
}

void LetBy(Program& program, std::uint64_t place) {
  program.LoadHigh(kPlace);
  program.SkipUnlessEqual(High(place), 3);
  program.LoadLow(kPlace);
  program.SkipUnlessEqual(Low(place), 1);
  program.Return(SECCOMP_RET_ALLOW);
}

void TrapPrivateCalls(Program& program) {
  using ZekCtl::Kernel::PrivateCall;
  program.Load(kNumber);
  program.SkipIfBelow(static_cast<std::uint32_t>(PrivateCall::kFirst), 2);
  program.SkipIfAbove(static_cast<std::uint32_t>(PrivateCall::kLast), 1);
  program.Return(SECCOMP_RET_TRAP);
}

void TrapPathOption(Program& program) {
  program.Load(kNumber);
  program.SkipUnlessEqual(SYS_prctl, 3);
  program.LoadLow(kFirstArgument);
  program.SkipUnlessEqual(ZekCtl::Kernel::kPrctlResolvePath, 1);
  program.Return(SECCOMP_RET_TRAP);
}

void LetByAllButAttributeCalls(Program& program) {
  program.Load(kNumber);
  program.SkipIfEqual(SYS_setxattr, 2);
  program.SkipIfEqual(SYS_getxattr, 1);
  program.Return(SECCOMP_RET_ALLOW);
}

void TrapFrom(Program& program, const CodeRange& range) {
  program.LoadHigh(kPlace);
  program.SkipUnlessEqual(High(range.begin), 4);
  program.LoadLow(kPlace);
  program.SkipIfBelow(Low(range.begin), 2);
  program.SkipIfAbove(Low(range.end - 1), 1);
  program.Return(SECCOMP_RET_TRAP);
}

}  // namespace

std::vector<sock_filter> BuildTrapFilter(const std::vector<CodeRange>& ownCode,
                                         std::uint64_t passThrough) {
  Program program;
  LetByOtherArchitectures(program);
  LetBy(program, passThrough);
  TrapPrivateCalls(program);
  TrapPathOption(program);
  LetByAllButAttributeCalls(program);
  for (const CodeRange& range : SplitAtHighWord(ownCode)) TrapFrom(program, range);
  program.Return(SECCOMP_RET_ALLOW);
  return program.Take();
}

}  // namespace StandIn
