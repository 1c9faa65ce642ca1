#include "tardisk/backing_tardisk.h"

#include <sys/stat.h>
#include <unistd.h>

#include <string_view>

#include "core/file_access.h"
#include "platform/sysinfo.h"
#include "platform/tavon_exception.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;

namespace {

class OpenFile {
 public:
  explicit OpenFile(const std::string& path) : descriptor_(OpenTardiskPolicyFile(path)) {
    if (descriptor_ < 0) throw TavonException("Unable to open policy file " + path);
  }
  ~OpenFile() { close(descriptor_); }
  OpenFile(const OpenFile&) = delete;
  OpenFile& operator=(const OpenFile&) = delete;

  [[nodiscard]] int Descriptor() const noexcept { return descriptor_; }

 private:
  int descriptor_;
};

// The reply is whole only when the accessor is gone: so the caller's record is filled, and none is
// handed back by value, which a compiler may copy before that.
void ReadInodeStats(unsigned long inode, ZekCtl::Util::InodeStats& stats) {
  ZekCtl::Util::Sysinfo service(ZekCtl::Util::kInodeStatsNode);
  service.AddInstancePath(inode);
  service.Get(&stats, sizeof stats);
}

}  // namespace

std::string BackingTardiskPath(const std::string& policyFile) {
  const OpenFile file(policyFile);
  struct stat attributes {};
  if (fstat(file.Descriptor(), &attributes) != 0) {
    throw TavonException("Unable to get attributes for policy file " + policyFile);
  }
  ZekCtl::Util::InodeStats stats{};
  ReadInodeStats(attributes.st_ino, stats);
  // The reply is not trusted to end in a NUL.
  const std::string_view field(stats.tardiskName, sizeof stats.tardiskName);
  const std::string_view name = field.substr(0, field.find('\0'));
  return name.empty() ? std::string() : kTardiskDir + std::string(name);
}

}  // namespace SecPolicy
