// Sizes, offsets and numbers with which programs and platforms were compiled. They hold on every
// machine with 8-byte pointers; most of this file compiles or it fails.
#include <gtest/gtest.h>

#include <cstddef>
#include <memory>
#include <string_view>
#include <type_traits>

#include "domain/file_path_access_rules.h"
#include "domain/keyword_rules.h"
#include "platform/private_calls.h"
#include "platform/sysinfo.h"
#include "platform/tavon_exception.h"
#include "secpolicy/secpolicy.h"
#include "tardisk/tardisk_exception_rules.h"

namespace SecPolicyTest {
namespace {

using namespace ZekCtl::Security;

static_assert(sizeof(void*) == 8 && sizeof(long) == 8, "the layouts below are those of LP64");
static_assert(sizeof(std::string) == 32 && alignof(std::string) == 8);
static_assert(sizeof(std::list<int>) == 24 && sizeof(std::map<int, int>) == 48);
static_assert(sizeof(std::shared_ptr<const void>) == 16);

// ---- Rule records --------------------------------------------------------------------------

template <typename Record>
constexpr bool kBeginsWithItsPlaceAndDomain = offsetof(Record, line) == 0 &&
                                              offsetof(Record, domainId) == 4 &&
                                              offsetof(Record, domainName) == 8 &&
                                              alignof(Record) == 8;

static_assert(kBeginsWithItsPlaceAndDomain<ZekAccess_FilePathAccessRule>);
static_assert(offsetof(ZekAccess_FilePathAccessRule, path) == 40);
static_assert(offsetof(ZekAccess_FilePathAccessRule, permissions) == 72);
static_assert(sizeof(ZekAccess_FilePathAccessRule) == 104);

static_assert(kBeginsWithItsPlaceAndDomain<ZekAccess_SyscallRule>);
static_assert(offsetof(ZekAccess_SyscallRule, syscall) == 40);
static_assert(offsetof(ZekAccess_SyscallRule, grant) == 72);
static_assert(sizeof(ZekAccess_SyscallRule) == 80);

static_assert(kBeginsWithItsPlaceAndDomain<ZekAccess_CapabilityRule>);
static_assert(offsetof(ZekAccess_CapabilityRule, capability) == 40);
static_assert(offsetof(ZekAccess_CapabilityRule, grant) == 72);
static_assert(sizeof(ZekAccess_CapabilityRule) == 80);

static_assert(kBeginsWithItsPlaceAndDomain<ZekAccess_CapabilityParamRule>);
static_assert(offsetof(ZekAccess_CapabilityParamRule, capability) == 40);
static_assert(offsetof(ZekAccess_CapabilityParamRule, parameter) == 72);
static_assert(offsetof(ZekAccess_CapabilityParamRule, grant) == 104);
static_assert(sizeof(ZekAccess_CapabilityParamRule) == 112);

static_assert(kBeginsWithItsPlaceAndDomain<ZekAccess_ObjectAccessRule>);
static_assert(offsetof(ZekAccess_ObjectAccessRule, object) == 40);
static_assert(offsetof(ZekAccess_ObjectAccessRule, access) == 72);
static_assert(offsetof(ZekAccess_ObjectAccessRule, grant) == 104);
static_assert(sizeof(ZekAccess_ObjectAccessRule) == 112);

static_assert(kBeginsWithItsPlaceAndDomain<ZekAccess_UnixSockCreationRule>);
static_assert(offsetof(ZekAccess_UnixSockCreationRule, label) == 40);
static_assert(offsetof(ZekAccess_UnixSockCreationRule, sockType) == 72);
static_assert(offsetof(ZekAccess_UnixSockCreationRule, grant) == 104);
static_assert(sizeof(ZekAccess_UnixSockCreationRule) == 112);

static_assert(kBeginsWithItsPlaceAndDomain<ZekAccess_FileCreationRule>);
static_assert(offsetof(ZekAccess_FileCreationRule, parentLabel) == 40);
static_assert(offsetof(ZekAccess_FileCreationRule, fileLabel) == 72);
static_assert(offsetof(ZekAccess_FileCreationRule, fileType) == 104);
static_assert(offsetof(ZekAccess_FileCreationRule, grant) == 136);
static_assert(sizeof(ZekAccess_FileCreationRule) == 144);

static_assert(kBeginsWithItsPlaceAndDomain<ZekAccess_DomTransRule>);
static_assert(offsetof(ZekAccess_DomTransRule, label) == 40);
static_assert(offsetof(ZekAccess_DomTransRule, targetDomain) == 72);
static_assert(offsetof(ZekAccess_DomTransRule, targetDomainId) == 104);
static_assert(offsetof(ZekAccess_DomTransRule, transition) == 112);
static_assert(offsetof(ZekAccess_DomTransRule, grant) == 144);
static_assert(sizeof(ZekAccess_DomTransRule) == 152);

using SecPolicy::ZekAccess_TardiskExceptionRule;
static_assert(offsetof(ZekAccess_TardiskExceptionRule, line) == 0);
static_assert(offsetof(ZekAccess_TardiskExceptionRule, tardisk) == 8);
static_assert(offsetof(ZekAccess_TardiskExceptionRule, label) == 40);
static_assert(offsetof(ZekAccess_TardiskExceptionRule, targetDomain) == 72);
static_assert(offsetof(ZekAccess_TardiskExceptionRule, targetDomainId) == 104);
static_assert(offsetof(ZekAccess_TardiskExceptionRule, policyFile) == 112);
static_assert(sizeof(ZekAccess_TardiskExceptionRule) == 144);

static_assert(std::is_trivial_v<ZekAccess_FileRule>, "filled by the kernel");
static_assert(std::is_standard_layout_v<ZekAccess_FileRule>);
static_assert(offsetof(ZekAccess_FileRule, path) == 0);
static_assert(sizeof(ZekAccess_FileRule::path) == 1984);
static_assert(offsetof(ZekAccess_FileRule, permission) == 1984);
static_assert(sizeof(ZekAccess_FileRule) == 1988 && alignof(ZekAccess_FileRule) == 4);
static_assert(sizeof(ZekAccess_FileRule[2]) == 3976, "an array has no gaps");

// ---- Numbers -------------------------------------------------------------------------------

static_assert(sizeof(ZekAccess_KeywordType) == 4 && sizeof(ZekAccessLabelType) == 4);
static_assert(kObjectKeyword == 1 && kCapabilityKeyword == 2 && kCapabilityParamKeyword == 3);
static_assert(kObjectAccessKeyword == 4 && kTransitionKeyword == 5 && kFileTypeKeyword == 6);
static_assert(kSockTypeKeyword == 7 && kSyscallKeyword == 8);
static_assert(kDomainLabel == 0 && kObjectLabel == 1);

using ZekCtl::Kernel::DomainOrigin;
using ZekCtl::Kernel::PrivateCall;

constexpr bool Is(PrivateCall call, long number) { return static_cast<long>(call) == number; }

static_assert(Is(PrivateCall::kCreateDomain, 16474) && Is(PrivateCall::kDestroyDomain, 16475));
static_assert(Is(PrivateCall::kUpdateRule, 16476) && Is(PrivateCall::kRemoveRule, 16477));
static_assert(Is(PrivateCall::kReadRules, 16478) && Is(PrivateCall::kCountRules, 16479));
static_assert(Is(PrivateCall::kAddRules, 16480) && Is(PrivateCall::kLeakedDomains, 16485));
static_assert(Is(PrivateCall::kWorldDomain, 16486) && Is(PrivateCall::kDomainName, 16487));
static_assert(Is(PrivateCall::kReplacePath, 16488));
static_assert(Is(PrivateCall::kFirst, 16474) && Is(PrivateCall::kLast, 16488));
static_assert(sizeof(PrivateCall) == 8 && sizeof(DomainOrigin) == 4);
static_assert(static_cast<unsigned int>(DomainOrigin::kPolicy) == 0);
static_assert(static_cast<unsigned int>(DomainOrigin::kRunTime) == 1);
static_assert(ZekCtl::Kernel::kStatusTableTooSmall == 0x0bad011f);
static_assert(ZekCtl::Kernel::kPrctlResolvePath == 4109);
static_assert(ZekCtl::Kernel::kPathBytes == 1984 && ZekCtl::Kernel::kDomainNameBytes == 128);
static_assert(std::string_view(ZekCtl::Kernel::kLabelAttribute) == "olvane.security");
static_assert(ZekCtl::Util::kInodeStatsNode == 0x0417);

// ---- Classes of the platform ---------------------------------------------------------------

// One pointer to what the implementation keeps, and no table of virtual functions.
static_assert(sizeof(ZekAccessInterfaceImpl) == 8);
static_assert(alignof(ZekAccessInterfaceImpl) == 8);
static_assert(!std::is_polymorphic_v<ZekAccessInterfaceImpl>);
static_assert(sizeof(ZekCtl::Util::Sysinfo) == 8);
static_assert(alignof(ZekCtl::Util::Sysinfo) == 8);
static_assert(!std::is_polymorphic_v<ZekCtl::Util::Sysinfo>);
static_assert(sizeof(ZekCtl::Util::InodeStats) == 544);
static_assert(offsetof(ZekCtl::Util::InodeStats, tardiskName) == 32);

// ---- Exceptions ----------------------------------------------------------------------------

using SecPolicy::SecPolicyRetryException;
using Tavon::Lib::KestMessage;
using Tavon::Lib::TavonException;

static_assert(sizeof(KestMessage) == 16 && alignof(KestMessage) == 8);
static_assert(!std::is_polymorphic_v<KestMessage>);
static_assert(sizeof(TavonException) == 56 && alignof(TavonException) == 8);
static_assert(sizeof(SecPolicyRetryException) == 56 && alignof(SecPolicyRetryException) == 8);

std::ptrdiff_t Distance(const void* from, const void* to) {
  return static_cast<const char*>(to) - static_cast<const char*>(from);
}

TEST(ExceptionLayoutTest, BasesStandAtTheBeginning) {
  const SecPolicyRetryException failure("text");
  EXPECT_EQ(Distance(&failure, static_cast<const TavonException*>(&failure)), 0);
  EXPECT_EQ(Distance(&failure, static_cast<const std::exception*>(&failure)), 0);
}

TEST(ExceptionLayoutTest, TextStandsBehindTheTableAndTheStructuredMessageLast) {
  const TavonException failure("text");
  // A short text stands inside the string, 16 bytes from its beginning.
  EXPECT_EQ(Distance(&failure, failure.what()), 8 + 16);
  EXPECT_EQ(Distance(&failure, &failure.StructuredMessage()), 40);
}

// ---- Rule sets -----------------------------------------------------------------------------

// The base keeps the keyword behind its table; each type adds a table and a list, and stands before
// the base, which is a virtual one.
template <typename Base, typename... Types>
constexpr bool kAddAList = sizeof(Base) == 8 + 32 &&
                           ((sizeof(Types) == 8 + 24 + sizeof(Base)) && ...);

static_assert(
    kAddAList<SecPolicy::PolicyRules, SecPolicy::FilePathAccessRules, SecPolicy::SyscallRules,
              SecPolicy::CapabilityRules, SecPolicy::CapabilityParamRules,
              SecPolicy::ObjectAccessRules, SecPolicy::DomTransRules, SecPolicy::FileCreationRules,
              SecPolicy::UnixSockCreationRules>);
static_assert(kAddAList<SecPolicy::TardiskRules, SecPolicy::TardiskExceptionRules>);

TEST(RuleSetLayoutTest, VirtualBaseStandsBehindTheList) {
  SecPolicy::SyscallRules rules;
  EXPECT_EQ(Distance(&rules, static_cast<SecPolicy::PolicyRules*>(&rules)), 32);
  SecPolicy::TardiskExceptionRules exceptions;
  EXPECT_EQ(Distance(&exceptions, static_cast<SecPolicy::TardiskRules*>(&exceptions)), 32);
}

}  // namespace
}  // namespace SecPolicyTest
