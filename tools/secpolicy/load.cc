// secpolicy load [--host DIR] [--wait SECONDS] [--trace] [--fail OPERATION[:N]] [POLICYDIR]
#include <sys/wait.h>
#include <unistd.h>

#include <cstring>
#include <exception>
#include <iostream>
#include <memory>
#include <stdexcept>

#include "host/image/session.h"
#include "tools/labels/descriptor_limit.h"
#include "tools/policy/child_process.h"
#include "tools/policy/error_messages.h"
#include "tools/policy/output.h"
#include "tools/policy/policy_path.h"
#include "tools/policy/progress.h"
#include "tools/policy/progress_filter.h"
#include "tools/policy/terminal.h"
#include "tools/query/host_paths.h"
#include "tools/requests/batch_load.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/source_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct LoadArguments {
  std::string host;
  std::string policy;
  StandIn::ChangeOptions changes;
  bool trace = false;
  std::vector<StandIn::Fault> faults;
};

// What the terminate handler needs, which is not handed anything.
struct Loading {
  StandIn::Session& session;
  std::string stateFile;
};
const Loading* loading = nullptr;

// A kernel keeps what was installed before the process ended, and so does this one.
[[noreturn]] void OnTerminate() {
  try {
    loading->session.Commit();
    ReportError("the load was terminated before its end; what it had installed until then is in " +
                loading->stateFile);
  } catch (const std::exception& failure) {
    ReportError(std::string("the load was terminated, and what it had installed is lost: ") +
                MessageOf(failure));
  }
  _exit(kTerminated);
}

StandIn::SessionOptions OptionsOf(const LoadArguments& arguments, const PolicyPath& policy) {
  StandIn::SessionOptions options{
      .visible = policy.visible, .trace = nullptr, .faults = arguments.faults};
  if (arguments.trace) {
    options.trace = [](const std::string& line) { std::cerr << "kernel: " + line + "\n"; };
  }
  return options;
}

// LoadPolicy in the host, kept as a whole. Runs in the child.
int LoadIn(StandIn::HostDirectory host, const LoadArguments& arguments) {
  const PolicyPath policy = LocatePolicy(arguments.policy);
  OpenProgressLog();
  const std::string stateFile = host.Ref().PathOf(StandIn::kStateFile);
  StandIn::Session session(std::move(host), OptionsOf(arguments, policy));
  const Loading current{session, stateFile};
  loading = &current;
  std::set_terminate(OnTerminate);
  const LoadEnd end = LoadInBatch(session, policy.path);
  session.Commit();
  return end == LoadEnd::kDone ? kDone : kFailed;
}

// The load may have been over but for its exit, or another process may have written.
std::string WhatTheKernelHolds(bool isWritten) {
  return isWritten ? "the kernel's state has been written since it began, see \"secpolicy show\""
                   : "the kernel holds what it held before";
}

ExitStatus Load(const LoadArguments& arguments) {
  StandIn::HostDirectory host = OpenHost(arguments.host, arguments.changes);
  const HostPaths paths(host);
  const StandIn::StateFile state(host);
  const StandIn::StateFile::Version before = state.CurrentVersion();
  Progress progress("Loading");
  const auto show = [&, isReasonShown = false](std::string& line) mutable {
    if (!FilterProgress(line)) return;
    progress.Clear();
    PrintLine(std::cerr, line);
    if (isReasonShown) return;
    const std::string reason = DescriptorLimitReason(
        line, [&](const std::string& dir) { return paths.OpensDirectory(dir); });
    isReasonShown = !reason.empty();
    if (isReasonShown) ReportError(reason);
  };
  const int status = RunInChild([&] { return LoadIn(std::move(host), arguments); }, show,
                                [&] { progress.Tick(); });
  progress.Clear();
  if (WIFSIGNALED(status)) {
    ReportError(std::string("the load was killed (") + strsignal(WTERMSIG(status)) + "); " +
                WhatTheKernelHolds(state.ChangedSince(before)));
    return kFailed;
  }
  return static_cast<ExitStatus>(WEXITSTATUS(status));
}

}  // namespace

CommandLine LoadVerb() {
  const auto arguments = std::make_shared<LoadArguments>();
  CommandLine verb{
      .name = "load",
      .description = "Load a policy into a host's kernel",
      .options = {HostOption(arguments->host),
                  {.names = {"--trace"},
                   .description = "Show every kernel operation",
                   .store = Into(arguments->trace)},
                  {.names = {"--fail"},
                   .value = "OPERATION[:N]",
                   .description = "Have the kernel refuse the N-th call (1) of an operation",
                   .store =
                       [arguments](const std::string& fault) {
                         arguments->faults.push_back(StandIn::ParseFault(fault));
                       },
                   .isRepeatable = true}},
      .operands = {OwnPolicyOperand(arguments->policy, "POLICYDIR")},
      .run = [arguments] { return Load(*arguments); }};
  AddChangeOptions(verb, arguments->changes);
  return verb;
}

}  // namespace SecPolicyTool
