#include "host/image/session.h"

#include <filesystem>
#include <utility>

#include "host/gate/gate.h"
#include "host/image/change_root.h"
#include "host/image/system_failure.h"
#include "host/module/description_json.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

namespace {

ModuleDescription DescriptionOf(const HostDirectory& host) {
  return ReadDescription(host.DescriptionText(), host.Ref().PathOf(kDescriptionFile));
}

RootIndex FilesOf(const HostDirectory& host) {
  auto files = RootIndex::Load(host);
  if (!files) {
    throw HostError(host.Path() + " has not been assembled; do it with \"secpolicy host assemble " +
                    host.Path() + "\"");
  }
  return std::move(*files);
}

std::string WithoutLinks(const std::string& path) {
  std::error_code error;
  std::string resolved = std::filesystem::canonical(path, error).string();
  if (error) throw SystemFailure(path, "resolved in the host", error.value());
  return resolved;
}

}  // namespace

Session::Session(HostDirectory host, const SessionOptions& options)
    : host_(std::move(host)),
      isKept_(options.kernel == SessionOptions::Kernel::kKept),
      module_(DescriptionOf(host_), processes_),
      file_(host_),
      keeper_(file_, host_.Ref().PathOf(kStateFile), module_),
      trace_(options.trace),
      observed_(module_, point_),
      files_(FilesOf(host_)),
      attached_{observed_, point_, module_, files_} {
  if (options.kernel != SessionOptions::Kernel::kScratch) keeper_.Refresh();
  for (const Fault& fault : options.faults) faults_.Add(fault);
  // The lock is held around everything; a fault is traced as the refusal that it stands for. What
  // has nothing to do would cost every operation a little.
  if (isKept_) point_.Add(keeper_);
  if (options.trace) point_.Add(trace_);
  if (!options.faults.empty()) point_.Add(faults_);
  ChangeRoot({files_.Root(), host_.Ref().PathOf(kRootDirectory)}, options.visible);
  for (const std::string& path : options.visible) attached_.visible.push_back(WithoutLinks(path));
  EnterGate();
  Attach(&attached_);
}

Session::~Session() { Attach(nullptr); }

}  // namespace StandIn
