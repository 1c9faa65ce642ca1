// The record of a path rule, byte by byte as the kernel gets it.
#include <sys/syscall.h>

#include <cstring>

#include "domain/file_path_access_rules.h"
#include "tests/domain/domain_fixture.h"
#include "tests/support/scripted_kernel.h"

namespace SecPolicyTest {
namespace {

class PathRecordTest : public DomainTest {
 protected:
  // Sets the rule "PATH rx" of the domain 7 under a kernel that resolves as `resolve` does, and
  // yields the calls that it sees.
  Outcome SetUnder(const std::string& path, KernelAnswer (*resolve)(const SeenCall&)) {
    return RunWithInterface([&](SecPolicy::ZekAccessInterfaceImpl& iface) {
      SecPolicy::FilePathAccessRules rules;
      rules.AddRule(1, "appDom", 7, std::queue<std::string>({path, "rx"}), iface);
      std::string seen;
      ScriptedKernel kernel([&](const SeenCall& call) {
        if (call.number == SYS_prctl) {
          seen += std::to_string(call.arguments[0]) + " " + call.At<const char>(1) + "\n";
          return resolve(call);
        }
        seen += TextOf(call);
        return KernelAnswer{};
      });
      rules.Set(iface);
      // The path is resolved into the very record that is sent.
      if (kernel.Calls().at(0).arguments[2] != kernel.Calls().at(1).arguments[2]) seen += "moved\n";
      return seen;
    });
  }

 private:
  // The path, the bytes behind its end that are not 0, and the numbers.
  static std::string TextOf(const SeenCall& call) {
    const char* const record = call.At<const char>(2);
    const std::string path(record, strnlen(record, 1984));
    std::size_t behind = 0;
    for (std::size_t i = path.size(); i < 1984; ++i) behind += record[i] != '\0' ? 1 : 0;
    std::uint32_t permission = 0;
    std::memcpy(&permission, record + 1984, sizeof permission);
    return std::to_string(call.number) + ": world " + std::to_string(call.arguments[0]) +
           ", domain " + std::to_string(call.arguments[1]) + ", " + path + " (" +
           std::to_string(path.size()) + " + " + std::to_string(behind) + ") " +
           std::to_string(permission) + ", count " + std::to_string(call.arguments[3]) +
           ", result " + std::to_string(*call.At<const std::uint32_t>(4)) + "\n";
  }
};

KernelAnswer ResolveToEtc(const SeenCall& call) {
  std::strcpy(call.At<char>(2), "/etc");
  return {};
}

KernelAnswer WriteSomethingAndFail(const SeenCall& call) {
  std::memset(call.At<char>(2), '?', 1984);
  return {-ENOENT, 0};
}

TEST_F(PathRecordTest, AResolvedPathIsSentWithItsPermission) {
  const Outcome outcome = SetUnder("/x/../etc", ResolveToEtc);
  EXPECT_EQ(outcome.value,
            "4109 /x/../etc\n16480: world 0, domain 7, /etc (4 + 0) 17, count 1, result 0\n");
}

TEST_F(PathRecordTest, WhatAFailedResolutionWroteIsNotSent) {
  const Outcome outcome = SetUnder("/x", WriteSomethingAndFail);
  EXPECT_EQ(outcome.value, "4109 /x\n16480: world 0, domain 7, /x (2 + 0) 17, count 1, result 0\n");
}

TEST_F(PathRecordTest, ACutPathKeepsItsTerminator) {
  const std::string path = "/" + std::string(1999, 'a');
  const Outcome outcome = SetUnder(path, WriteSomethingAndFail);
  EXPECT_EQ(outcome.value, "4109 " + path + "\n16480: world 0, domain 7, " + path.substr(0, 1983) +
                               " (1983 + 0) 17, count 1, result 0\n");
}

}  // namespace
}  // namespace SecPolicyTest
