// The reply of the system-information service is read after the accessor is gone, also where the
// compiler leaves no copy out: this program is compiled so.
#include "tardisk/backing_tardisk.h"

#include <gtest/gtest.h>

#include <cstring>

#include "platform/sysinfo.h"

namespace ZekCtl::Util {

// A service that delivers its reply with the end of the accessor.
struct Sysinfo::State {
  InodeStats* reply = nullptr;
};

Sysinfo::Sysinfo(unsigned int) : state_(new State) {}

Sysinfo::~Sysinfo() {
  if (state_->reply != nullptr) std::strcpy(state_->reply->tardiskName, "vendor");
}

void Sysinfo::AddInstancePath(const unsigned long&) {}

void Sysinfo::Get(void* buffer, unsigned int) { state_->reply = static_cast<InodeStats*>(buffer); }

}  // namespace ZekCtl::Util

namespace SecPolicyTest {
namespace {

TEST(BackingTardiskWithoutElisionTest, ReplyIsReadAfterTheAccessorIsGone) {
  EXPECT_EQ(SecPolicy::BackingTardiskPath("/dev/null"), "/tardisks/vendor");
}

}  // namespace
}  // namespace SecPolicyTest
