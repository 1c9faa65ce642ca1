// secpolicy load [--host DIR] [--wait SECONDS] [--trace] [--fail OPERATION[:N]] [POLICYDIR]
#include <unistd.h>

#include <iostream>
#include <memory>

#include "tools/labels/descriptor_limit.h"
#include "tools/policy/batch_load.h"
#include "tools/policy/library_output.h"
#include "tools/policy/output.h"
#include "tools/policy/progress.h"
#include "tools/policy/terminal.h"
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

// Progress and errors, as they come, on standard error and in the system log.
class LoadOutput final : public StandIn::LibraryOutput {
 public:
  void OnInfo(const std::string& message) override {
    Print(message);
    LogProgress(message);
  }
  void OnError(const std::string& message, const Tavon::Lib::TavonException*) override {
    Print("Error: " + message);
    LogFailure(message);
    AddReason();
  }
  void OnPrint(const std::string&) override {}

  void OnOperation(const std::string& line) { Print("kernel: " + line); }
  // The kernel has something to do.
  void Tick() { progress_.Tick(); }

 private:
  void Print(const std::string& line) {
    progress_.Clear();
    PrintLine(std::cerr, line);
  }
  // The first error of its kind is explained.
  void AddReason() {
    if (isReasonShown_) return;
    StandIn::LibraryUse* use = StandIn::LibraryUse::Current();
    isReasonShown_ = use != nullptr && use->TakeDescriptorShortage();
    if (isReasonShown_) ReportError(DescriptorLimitReason());
  }

  SystemLog log_;
  Progress progress_{"Loading"};
  bool isReasonShown_ = false;
};

// Shows that time passes.
class Ticks final : public StandIn::OperationHook {
 public:
  void Around(const StandIn::OperationCall&, const StandIn::Callable<void>& proceed) override {
    if (output != nullptr) output->Tick();
    proceed();
  }

  LoadOutput* output = nullptr;
};

// Keeps what a load installed that was terminated.
void KeepTerminated(StandIn::Kernel& kernel) {
  try {
    kernel.Commit();
    ReportError("the load was terminated before its end; what it had installed until then is in " +
                kernel.Directory().Ref().PathOf(StandIn::kStateFile));
  } catch (const std::exception& failure) {
    ReportError("the load was terminated, and what it had installed is lost: " +
                MessageOf(failure));
  }
}

ExitStatus Load(const LoadArguments& arguments) {
  const PolicyPath policy = LocatePolicy(arguments.policy);
  Ticks ticks;
  StandIn::KernelOptions options{.faults = arguments.faults};
  if (arguments.trace) {
    options.trace = [&](const std::string& line) { ticks.output->OnOperation(line); };
  }
  if (isatty(STDERR_FILENO) == 1) options.hooks.push_back(&ticks);
  StandIn::Kernel kernel(OpenHost(arguments.host, arguments.changes), options);
  LoadOutput output;
  ticks.output = &output;
  const StandIn::LoadEnd end = LoadInBatch(policy, kernel, output);
  if (end == StandIn::LoadEnd::kTerminated) {
    KeepTerminated(kernel);
    return kTerminated;
  }
  kernel.Commit();
  return end == StandIn::LoadEnd::kDone ? kDone : kFailed;
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
