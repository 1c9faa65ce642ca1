#include "secpolicy/host/entered_host.h"

#include "host/session/session.h"

namespace StandIn {

namespace {

SessionOptions SessionOptionsOf(const EnterOptions& options) {
  SessionOptions result{
      .visible = options.visible, .trace = options.trace, .faults = {}, .kernel = options.kernel};
  for (const std::string& fault : options.faults) result.faults.push_back(ParseFault(fault));
  return result;
}

}  // namespace

EnteredHost::EnteredHost(const std::string& dir, const EnterOptions& options)
    : session_(std::make_unique<Session>(HostDirectory(dir), SessionOptionsOf(options))) {}

EnteredHost::~EnteredHost() = default;

void EnteredHost::BeginBatch() { session_->BeginBatch(); }

void EnteredHost::Commit() { session_->Commit(); }

}  // namespace StandIn
