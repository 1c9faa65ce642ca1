// The platform's system-information service, as far as the library asks it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

namespace ZekCtl::Util {

// The node that answers per inode of the in-memory root file system; its instances are inode
// numbers and its reply is an InodeStats.
inline constexpr std::uint16_t kInodeStatsNode = 0x0417;

// The reply of kInodeStatsNode.
struct InodeStats {
  char reserved[32];  // the service's own
  // Name of the tardisk that holds the inode, NUL-terminated; empty when none does.
  char tardiskName[512];
};
static_assert(sizeof(InodeStats) == 544 && offsetof(InodeStats, tardiskName) == 32);

// One question to the service: name a node, select an instance, read the reply.
class [[gnu::visibility("default")]] Sysinfo {
 public:
  // An accessor for `node`. Throws Tavon::Lib::TavonException when the service cannot be reached.
  explicit Sysinfo(unsigned int node);
  ~Sysinfo();
  Sysinfo(const Sysinfo&) = delete;
  Sysinfo& operator=(const Sysinfo&) = delete;

  // Selects the instance to read; for kInodeStatsNode the inode number.
  void AddInstancePath(const unsigned long& instance);

  // Fills `buffer` with the node's reply for the selected instance. `size` must be the size of
  // that reply. Throws Tavon::Lib::TavonException, and leaves the buffer as it was, when the node
  // or the instance is unknown or the size is wrong.
  void Get(void* buffer, unsigned int size);

 private:
  struct State;  // defined by whoever implements the class
  std::unique_ptr<State> state_;
};

}  // namespace ZekCtl::Util
