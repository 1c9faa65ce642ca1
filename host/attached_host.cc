#include "host/attached_host.h"

namespace StandIn {

namespace {

const AttachedHost* attached = nullptr;

}  // namespace

void Attach(const AttachedHost* host) noexcept { attached = host; }

const AttachedHost* Attached() noexcept { return attached; }

}  // namespace StandIn
