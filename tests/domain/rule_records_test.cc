// The fields of rule records stand in the order in which the access library takes them.
#include <gtest/gtest.h>

#include "platform/zek_access.h"

namespace SecPolicyTest {
namespace {

using namespace ZekCtl::Security;

TEST(RuleRecordsTest, RulesOfOneWord) {
  const ZekAccess_SyscallRule call{1, 2, "domain", "call", true};
  EXPECT_EQ(call.line, 1u);
  EXPECT_EQ(call.domainId, 2u);
  EXPECT_EQ(call.domainName + " " + call.syscall, "domain call");
  const ZekAccess_CapabilityRule capability{1, 2, "domain", "capability", true};
  EXPECT_EQ(capability.domainName + " " + capability.capability, "domain capability");
  EXPECT_TRUE(call.grant && capability.grant);
}

TEST(RuleRecordsTest, RulesOfTwoWords) {
  const ZekAccess_FilePathAccessRule path{1, 2, "domain", "path", "letters"};
  EXPECT_EQ(path.domainName + " " + path.path + " " + path.permissions, "domain path letters");
  const ZekAccess_CapabilityParamRule capability{1, 2, "domain", "capability", "parameter", true};
  EXPECT_EQ(capability.domainName + " " + capability.capability + " " + capability.parameter,
            "domain capability parameter");
  const ZekAccess_ObjectAccessRule object{1, 2, "domain", "object", "access", true};
  EXPECT_EQ(object.domainName + " " + object.object + " " + object.access, "domain object access");
  const ZekAccess_UnixSockCreationRule socket{1, 2, "domain", "label", "type", true};
  EXPECT_EQ(socket.domainName + " " + socket.label + " " + socket.sockType, "domain label type");
  EXPECT_TRUE(capability.grant && object.grant && socket.grant);
}

TEST(RuleRecordsTest, RulesOfThreeWords) {
  const ZekAccess_FileCreationRule file{1, 2, "domain", "parent", "file", "type", true};
  EXPECT_EQ(file.domainName + " " + file.parentLabel + " " + file.fileLabel + " " + file.fileType,
            "domain parent file type");
  const ZekAccess_DomTransRule transition{1, 2, "domain", "label", "target", 3, "event", true};
  EXPECT_EQ(transition.domainName + " " + transition.label + " " + transition.targetDomain + " " +
                transition.transition,
            "domain label target event");
  EXPECT_EQ(transition.targetDomainId, 3u);
  EXPECT_TRUE(file.grant && transition.grant);
}

}  // namespace
}  // namespace SecPolicyTest
