// The service that knows which archive brought a file.
#include "platform/sysinfo.h"

#include <sys/stat.h>

#include <cstring>

#include "tests/host/access/access_fixture.h"

namespace StandIn {
namespace {

using ZekCtl::Util::InodeStats;
using ZekCtl::Util::kInodeStatsNode;
using ZekCtl::Util::Sysinfo;

class SysinfoTest : public AccessTest {
 protected:
  [[nodiscard]] unsigned long InodeOf(const std::string& name) const {
    struct stat status {};
    EXPECT_EQ(stat((root_ / name).c_str(), &status), 0);
    return status.st_ino;
  }

  static InodeStats Ask(unsigned long inode) {
    InodeStats stats;
    std::memset(&stats, 'x', sizeof stats);
    Sysinfo service(kInodeStatsNode);
    service.AddInstancePath(inode);
    service.Get(&stats, sizeof stats);
    return stats;
  }
};

TEST_F(SysinfoTest, NamesTheArchiveOfAFile) {
  EXPECT_STREQ(Ask(InodeOf("motd")).tardiskName, "base.tar");
  EXPECT_EQ(lines_, std::vector<std::string>{"backing-tardisk base.tar"});
}

TEST_F(SysinfoTest, FileOfNoArchiveHasAnEmptyName) {
  WriteBytes(root_ / "new", "");
  EXPECT_STREQ(Ask(InodeOf("new")).tardiskName, "");
  EXPECT_STREQ(Ask(InodeOf("")).tardiskName, "");
  EXPECT_STREQ(Ask(~0UL).tardiskName, "");
}

TEST_F(SysinfoTest, LastInstanceCounts) {
  InodeStats stats;
  Sysinfo service(kInodeStatsNode);
  service.AddInstancePath(~0UL);
  service.AddInstancePath(InodeOf("motd"));
  service.Get(&stats, sizeof stats);
  EXPECT_STREQ(stats.tardiskName, "base.tar");
}

TEST_F(SysinfoTest, OtherNodesAreUnknown) {
  InodeStats stats{};
  EXPECT_EQ(ErrorOf([&] { Sysinfo(kInodeStatsNode + 1).Get(&stats, sizeof stats); }),
            "the system-information service has no node 1048");
}

TEST_F(SysinfoTest, BufferIsOfTheReplysSize) {
  std::array<char, 1024> buffer{};
  Sysinfo service(kInodeStatsNode);
  service.AddInstancePath(InodeOf("motd"));
  for (const unsigned int size : {0u, 32u, 543u, 545u, 1024u}) {
    EXPECT_EQ(ErrorOf([&] { service.Get(buffer.data(), size); }),
              "a reply of 544 bytes does not fit " + std::to_string(size));
  }
  EXPECT_EQ(buffer, (std::array<char, 1024>{}));
}

TEST_F(SysinfoTest, RefusalLeavesTheBufferAsItWas) {
  faults_.Add({.operation = Operation::kBackingTardisk});
  InodeStats stats{};
  Sysinfo service(kInodeStatsNode);
  service.AddInstancePath(InodeOf("motd"));
  EXPECT_EQ(ErrorOf([&] { service.Get(&stats, sizeof stats); }),
            "refused on request: backing-tardisk, call 1");
  EXPECT_STREQ(stats.tardiskName, "");
}

TEST_F(SysinfoTest, WithoutAHostItCannotBeReached) {
  Attach(nullptr);
  EXPECT_EQ(ErrorOf([] { Sysinfo service(kInodeStatsNode); }),
            "the kernel's security module cannot be reached: no host has been entered");
}

}  // namespace
}  // namespace StandIn
