#include "host/session/session.h"

#include <filesystem>
#include <utility>

#include "host/files/system_failure.h"
#include "host/gate/gate.h"
#include "host/session/change_root.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

namespace {

std::string WithoutLinks(const std::string& path) {
  std::error_code error;
  std::string resolved = std::filesystem::canonical(path, error).string();
  if (error) throw SystemFailure(path, "resolved in the host", error.value());
  return resolved;
}

}  // namespace

Session::Session(HostDirectory host, const SessionOptions& options)
    : kernel_(std::move(host),
              {.state = options.kernel, .trace = options.trace, .faults = options.faults}),
      attached_(kernel_.Attachment()) {
  const DirectoryRef root{kernel_.Files().Tree().Root(),
                          kernel_.Directory().Ref().PathOf(kRootDirectory)};
  ChangeRoot(root, options.visible);
  for (const std::string& path : options.visible) attached_.visible.push_back(WithoutLinks(path));
  EnterGate();
  Attach(&attached_);
}

Session::~Session() { Attach(nullptr); }

}  // namespace StandIn
