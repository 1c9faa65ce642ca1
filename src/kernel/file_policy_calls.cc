#include "core/diagnostics.h"
#include "kernel/private_call.h"
#include "platform/tavon_strcat.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;
using ZekCtl::Kernel::PrivateCall;

namespace {

void RequireText(const std::string& text, const char* failure) {
  if (text.empty()) throw TavonException(failure);
}

}  // namespace

void AddFilePolicyBatch(int worldId, unsigned int domainId, ZekAccess_FileRule* rules,
                        unsigned int count, unsigned int* result) {
  if (IssuePrivateCall(PrivateCall::kAddRules, worldId, domainId, rules, count, result) != 0) {
    throw TavonException(StrCat("Failed to add file policies to domain :", domainId,
                                ": world ID :", worldId, ":", SystemReason()));
  }
}

void RemoveFilePolicy(int worldId, unsigned int domainId, const std::string& path) {
  RequireText(path, "file path is empty");
  if (IssuePrivateCall(PrivateCall::kRemoveRule, worldId, domainId, path.c_str()) != 0) {
    throw TavonException(StrCat("Failed to remove file policy from domain :", domainId,
                                " : world id :", worldId, ":", SystemReason()));
  }
}

void UpdateFilePolicy(unsigned int domainId, const std::string& path, unsigned int permission) {
  RequireText(path, "File path is empty");
  if (IssuePrivateCall(PrivateCall::kUpdateRule, domainId, path.c_str(), permission) != 0) {
    throw TavonException(StrCat("Failed to update file policy: ", path, ": ", SystemReason()));
  }
}

void ReplaceFilePolicyVMs(const std::string& oldPath, const std::string& newPath) {
  RequireText(oldPath, "Old path is empty");
  RequireText(newPath, "New path is empty");
  if (IssuePrivateCall(PrivateCall::kReplacePath, oldPath.c_str(), newPath.c_str()) != 0) {
    throw TavonException(
        StrCat("Failed to replace file policy: ", oldPath, " to: ", newPath, ": ", SystemReason()));
  }
}

unsigned int RetrieveNumberOfFilePolicies(unsigned int domainId) {
  unsigned int count = 0;
  if (IssuePrivateCall(PrivateCall::kCountRules, domainId, &count) != 0) {
    // The doubled colon belongs to the text.
    throw TavonException(StrCat("Failed to get number of file policies for domain :: ", domainId,
                                ":", SystemReason()));
  }
  return count;
}

void RetrieveFilePolicies(unsigned int domainId, ZekAccess_FileRule* rules, unsigned int capacity) {
  const long status = IssuePrivateCall(PrivateCall::kReadRules, domainId, rules, capacity);
  if (status == 0) return;
  // The doubled colon belongs to the text.
  const std::string failure =
      StrCat("Failed to retrieve policies from domain:: ", domainId, " : ", SystemReason());
  if (status == ZekCtl::Kernel::kStatusTableTooSmall) throw SecPolicyRetryException(failure);
  throw TavonException(failure);
}

}  // namespace SecPolicy
