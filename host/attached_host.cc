#include "host/attached_host.h"

namespace StandIn {

namespace {

const AttachedHost* ofProcess = nullptr;
// Reached without a call that could allocate, for signal handlers.
[[gnu::tls_model("initial-exec")]] thread_local const AttachedHost* ofThread = nullptr;

}  // namespace

void Attach(const AttachedHost* host) noexcept { ofProcess = host; }

ThreadAttachment::ThreadAttachment(const AttachedHost& host) noexcept : before_(ofThread) {
  ofThread = &host;
}

ThreadAttachment::~ThreadAttachment() { ofThread = before_; }

const AttachedHost* Attached() noexcept { return ofThread != nullptr ? ofThread : ofProcess; }

}  // namespace StandIn
