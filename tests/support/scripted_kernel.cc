#include "tests/support/scripted_kernel.h"

#include <utility>

#include "host/gate/trapped_call.h"

namespace SecPolicyTest {

ScriptedKernel* ScriptedKernel::current_ = nullptr;

ScriptedKernel::ScriptedKernel(Script script) : script_(std::move(script)) {
  current_ = this;
  struct sigaction action {};
  action.sa_sigaction = OnTrap;
  action.sa_flags = SA_SIGINFO;
  sigaction(SIGSYS, &action, &host_);
}

ScriptedKernel::~ScriptedKernel() { sigaction(SIGSYS, &host_, nullptr); }

void ScriptedKernel::OnTrap(int, siginfo_t*, void* context) {
  StandIn::TrappedCall call(*static_cast<ucontext_t*>(context));
  SeenCall seen{call.Number(), {}};
  for (unsigned int i = 0; i < seen.arguments.size(); ++i) seen.arguments[i] = call.Argument(i);
  current_->calls_.push_back(seen);
  const KernelAnswer answer = current_->script_(seen);
  call.SetResult(answer.status);
  call.SetSecondResult(answer.error);
}

}  // namespace SecPolicyTest
