// The rule type "-r": access to paths.
#pragma once

#include <cstdint>
#include <list>
#include <string>

#include "domain/policy_rules.h"

namespace SecPolicy {

// Unlike the other types, these rules go to the kernel through AddFilePolicyBatch, one call a rule,
// with the path as the kernel resolves it; a path that it cannot resolve is sent as written, cut to
// 1983 characters. Permissions are looked at only then.
class FilePathAccessRules : public virtual PolicyRules {
 public:
  void AddRule(unsigned int line, std::string domainName, unsigned int domainId,
               std::queue<std::string> args, ZekAccessInterfaceImpl& iface) override;
  void Set(ZekAccessInterfaceImpl& iface) override;
  void ReadSystemRules(unsigned int domainId, ZekAccessInterfaceImpl& iface) override;
  // Does nothing.
  void CheckConstraints(std::string domainName, ZekAccessInterfaceImpl& iface) override;
  void PrintRules() override;

  // The bits of the letters "rwx": 0x1, 0x2, 0x10; 0 for none. Throws "Please enter the permissions
  // from [rwx]." for more than three, "Read access already specified." (Write, Exec) for a letter
  // that stands twice, "Unknown access privilege specified." for another one.
  static std::uint32_t GetPermission(std::string perms);

 private:
  std::list<ZekCtl::Security::ZekAccess_FilePathAccessRule> rules_;
};

}  // namespace SecPolicy
