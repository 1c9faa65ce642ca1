// The system-information service, as far as the library asks it.
#include "platform/sysinfo.h"

#include <cstring>
#include <string>

#include "host/access/host_in_use.h"

namespace ZekCtl::Util {

using StandIn::AsPlatform;
using StandIn::AttachedHost;
using StandIn::HostInUse;
using StandIn::Operation;
using Tavon::Lib::TavonException;

struct Sysinfo::State {
  const AttachedHost& host = HostInUse();
  unsigned int node;
  unsigned long inode = 0;
};

Sysinfo::Sysinfo(unsigned int node) : state_(new State{.node = node}) {}

Sysinfo::~Sysinfo() = default;

void Sysinfo::AddInstancePath(const unsigned long& instance) { state_->inode = instance; }

void Sysinfo::Get(void* buffer, unsigned int size) {
  if (state_->node != kInodeStatsNode) {
    throw TavonException("the system-information service has no node " +
                         std::to_string(state_->node));
  }
  InodeStats stats{};
  if (size != sizeof stats) {
    throw TavonException("a reply of " + std::to_string(sizeof stats) + " bytes does not fit " +
                         std::to_string(size));
  }
  const std::string tardisk = AsPlatform([&] {
    return state_->host.point.Pass(
        Operation::kBackingTardisk, [&] { return state_->host.files.TardiskOf(state_->inode); },
        [&] { return state_->host.files.TardiskOf(state_->inode); });
  });
  tardisk.copy(stats.tardiskName, sizeof stats.tardiskName - 1);
  std::memcpy(buffer, &stats, sizeof stats);
}

}  // namespace ZekCtl::Util
