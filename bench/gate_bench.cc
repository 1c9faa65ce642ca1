// Private calls to the kernel through the gate.
#include <benchmark/benchmark.h>
#include <linux/filter.h>
#include <linux/seccomp.h>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <csignal>
#include <cstddef>
#include <stdexcept>

#include "bench/support/host_process.h"
#include "bench/support/rules.h"
#include "kernel/private_call.h"
#include "platform/private_calls.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicyBench {
namespace {

using ZekCtl::Kernel::PrivateCall;

constexpr int kCalls = 200'000;
// A private number without a meaning.
constexpr auto kNothing = static_cast<PrivateCall>(static_cast<long>(PrivateCall::kAddRules) + 1);

Cost CallNothing() {
  return Measure([] {
    for (int i = 0; i < kCalls; ++i) SecPolicy::IssuePrivateCall(kNothing);
  });
}

void ThroughTheGate(benchmark::State& state) {
  RunEach(state, BenchHost::Plain(), "", kCalls, CallNothing);
}
BENCHMARK(ThroughTheGate)->Name("gate/call that does nothing")->UseManualTime();

// ---- A filter and a handler that do nothing else ------------------------------------------------

void AnswerNothing(int, siginfo_t*, void* context) {
#if defined(__x86_64__)
  static_cast<ucontext_t*>(context)->uc_mcontext.gregs[REG_RAX] = -ENOSYS;
#elif defined(__aarch64__)
  static_cast<ucontext_t*>(context)->uc_mcontext.regs[0] = static_cast<unsigned long>(-ENOSYS);
#endif
}

void TrapOneCall() {
  struct sigaction action {};
  action.sa_sigaction = AnswerNothing;
  action.sa_flags = SA_SIGINFO | SA_NODEFER;
  sigaction(SIGSYS, &action, nullptr);
  sock_filter filter[] = {
      BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, nr)),
      BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, static_cast<std::uint32_t>(kNothing), 0, 1),
      BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_TRAP),
      BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ALLOW),
  };
  const sock_fprog program{4, filter};
  if (prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0) != 0 ||
      syscall(SYS_seccomp, SECCOMP_SET_MODE_FILTER, 0, &program) != 0) {
    throw std::runtime_error("no filter");
  }
}

void BareSignal(benchmark::State& state) {
  RunEach(state, BenchHost::Outside(), "", kCalls, [] {
    TrapOneCall();
    return CallNothing();
  });
}
BENCHMARK(BareSignal)->Name("gate/bare signal")->UseManualTime();

// ---- Path rules ---------------------------------------------------------------------------------

constexpr int kPathRules = 20'000;

std::vector<std::string> Paths() {
  std::vector<std::string> paths;
  for (int i = 0; i < kPathRules; ++i) {
    paths.push_back("/tree/directory" + std::to_string(i / 1000) + "/file" +
                    std::to_string(i % 1000));
  }
  return paths;
}

const std::string& PathPolicy() {
  static const std::string dir = [] {
    std::string text;
    for (const std::string& path : Paths()) text += "-r " + path + " rw\n";
    std::string path = Scratch() + "/paths";
    WriteDomain(path, text);
    return path;
  }();
  return dir;
}

void LoadPathRules(benchmark::State& state) {
  const std::string& policy = PathPolicy();
  RunEach(state, BenchHost::WithTree(), policy, kPathRules, [&] {
    ZekCtl::Security::ZekAccessInterfaceImpl iface;
    return Measure([&] { SecPolicy::LoadPolicyDomains(policy + "/domains", iface); });
  });
}
BENCHMARK(LoadPathRules)->Name("path rules/load")->UseManualTime();

void CallPathRules(benchmark::State& state) {
  const std::vector<std::string> paths = Paths();
  RunEach(state, BenchHost::WithTree(), "", kPathRules, [&] {
    const unsigned int domain = SecPolicy::CreateDomain("appDom");
    return Measure([&] {
      ZekCtl::Security::ZekAccess_FileRule rule{};
      rule.permission = 0x3;
      for (const std::string& path : paths) {
        unsigned int taken = 0;
        if (prctl(ZekCtl::Kernel::kPrctlResolvePath, path.c_str(), rule.path) != 0 ||
            SecPolicy::IssuePrivateCall(PrivateCall::kAddRules, 0, domain, &rule, 1U, &taken) !=
                0) {
          throw std::runtime_error("no rule for " + path);
        }
      }
    });
  });
}
BENCHMARK(CallPathRules)->Name("path rules/two calls each")->UseManualTime();

}  // namespace
}  // namespace SecPolicyBench
