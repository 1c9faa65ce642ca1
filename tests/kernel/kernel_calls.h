// The functions that issue one private call each, as one table for tests.
#pragma once

#include <array>
#include <string>

#include "host/trace/operation.h"
#include "platform/private_calls.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicyTest {

struct KernelCall {
  const char* name;
  ZekCtl::Kernel::PrivateCall number;
  StandIn::Operation operation;
  void (*call)();
  std::string failure;  // the message before the reason
};

inline const std::array<KernelCall, 11>& KernelCalls() {
  using ZekCtl::Kernel::PrivateCall;
  using Expected = StandIn::Operation;
  static unsigned int cell = 0;
  static SecPolicy::ZekAccess_FileRule rule{"/a", 1};
  static const std::array<KernelCall, 11> calls{{
      {"CreateDomain", PrivateCall::kCreateDomain, Expected::kCreateDomain,
       [] { SecPolicy::CreateDomain("appDom"); }, "Failed to create domain:appDom :"},
      {"DestroyDomain", PrivateCall::kDestroyDomain, Expected::kDestroyDomain,
       [] { SecPolicy::DestroyDomain(7); }, "Failed to destroy domain:"},
      {"GetDomainIDForWorld", PrivateCall::kWorldDomain, Expected::kWorldDomain,
       [] { SecPolicy::GetDomainIDForWorld(7); }, "Unable to get domain ID: "},
      {"GetDomainNameForID", PrivateCall::kDomainName, Expected::kDomainName,
       [] { SecPolicy::GetDomainNameForID(7); }, "Unable to get domain name: "},
      {"RetrieveLeakedDomains", PrivateCall::kLeakedDomains, Expected::kLeakedDomains,
       [] { SecPolicy::RetrieveLeakedDomains(1, &cell, &cell); },
       "Failed to retrieve leaked domain list:"},
      {"AddFilePolicyBatch", PrivateCall::kAddRules, Expected::kAddFileRules,
       [] { SecPolicy::AddFilePolicyBatch(-3, 7, &rule, 1, &cell); },
       "Failed to add file policies to domain :7: world ID :-3:"},
      {"RemoveFilePolicy", PrivateCall::kRemoveRule, Expected::kRemoveFileRule,
       [] { SecPolicy::RemoveFilePolicy(-3, 7, "/a"); },
       "Failed to remove file policy from domain :7 : world id :-3:"},
      {"UpdateFilePolicy", PrivateCall::kUpdateRule, Expected::kUpdateFileRule,
       [] { SecPolicy::UpdateFilePolicy(7, "/a", 1); }, "Failed to update file policy: /a: "},
      {"ReplaceFilePolicyVMs", PrivateCall::kReplacePath, Expected::kReplacePath,
       [] { SecPolicy::ReplaceFilePolicyVMs("/a", "/b"); },
       "Failed to replace file policy: /a to: /b: "},
      {"RetrieveNumberOfFilePolicies", PrivateCall::kCountRules, Expected::kCountFileRules,
       [] { SecPolicy::RetrieveNumberOfFilePolicies(7); },
       "Failed to get number of file policies for domain :: 7:"},
      {"RetrieveFilePolicies", PrivateCall::kReadRules, Expected::kReadFileRules,
       [] { SecPolicy::RetrieveFilePolicies(7, &rule, 1); },
       "Failed to retrieve policies from domain:: 7 : "},
  }};
  return calls;
}

}  // namespace SecPolicyTest
