#include "host/kernel/kernel.h"

#include <utility>

#include "host/module/description_json.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

namespace {

ModuleDescription DescriptionOf(const HostDirectory& host) {
  return ReadDescription(host.DescriptionText(), host.Ref().PathOf(kDescriptionFile));
}

// The files of the host, together with the state of its kernel, which `refresh` reads.
RootIndex FilesOf(const HostDirectory& host, const KernelOptions& options,
                  const std::function<void()>& refresh) {
  auto files = RootIndex::Load(host, refresh);
  if (files) return std::move(*files);
  if (options.root == KernelOptions::Root::kOptional) return RootIndex({}, UniqueFd());
  throw HostError(host.Path() + " has not been assembled; do it with \"secpolicy host assemble " +
                  host.Path() + "\"");
}

}  // namespace

Kernel::Kernel(HostDirectory host, const KernelOptions& options)
    : host_(std::move(host)),
      isKept_(options.state == KernelOptions::State::kKept),
      module_(StartModule(DescriptionOf(host_), processes_)),
      file_(host_),
      keeper_(file_, host_.Ref().PathOf(kStateFile), *module_),
      trace_(options.trace),
      observed_(*module_, point_),
      files_(FilesOf(host_, options,
                     [&] {
                       if (options.state != KernelOptions::State::kScratch) keeper_.Refresh();
                     })),
      attached_{observed_, point_, *module_, files_} {
  for (const Fault& fault : options.faults) faults_.Add(fault);
  // The lock is held around everything; a fault is traced as the refusal that it stands for. What
  // has nothing to do would cost every operation a little.
  if (isKept_) point_.Add(keeper_);
  if (options.trace) point_.Add(trace_);
  if (!options.faults.empty()) point_.Add(faults_);
  for (OperationHook* hook : options.hooks) point_.Add(*hook);
}

}  // namespace StandIn
