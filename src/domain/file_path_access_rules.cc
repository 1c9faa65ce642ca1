#include "domain/file_path_access_rules.h"

#include <array>

#include "core/diagnostics.h"
#include "kernel/path_resolution.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using ZekCtl::Security::ZekAccess_FilePathAccessRule;

namespace {

struct Permission {
  char letter;
  std::uint32_t bit;
  const char* repeated;
};

// Execute is 0x10: the kernel keeps the bits between for itself.
constexpr std::array<Permission, 3> kPermissions{{
    {'r', 0x1, "Read access already specified."},
    {'w', 0x2, "Write access already specified."},
    {'x', 0x10, "Exec access already specified."},
}};

const Permission& FindPermission(char letter) {
  for (const Permission& permission : kPermissions) {
    if (permission.letter == letter) return permission;
  }
  throw TavonException("Unknown access privilege specified.");
}

// The kernel's record of the rule's path; the permission is left 0.
ZekAccess_FileRule ResolvedRule(const std::string& path) {
  ZekAccess_FileRule fileRule{};
  if (!ResolvePath(path, fileRule)) {
    SecpolicyInfo("Getting realpath failed: " + path);
    fileRule = {};
    path.copy(fileRule.path, sizeof fileRule.path - 1);
  }
  return fileRule;
}

void SetRule(const ZekAccess_FilePathAccessRule& rule) {
  ZekAccess_FileRule fileRule = ResolvedRule(rule.path);
  fileRule.permission = FilePathAccessRules::GetPermission(rule.permissions);
  unsigned int taken = 0;
  AddFilePolicyBatch(0, rule.domainId, &fileRule, 1, &taken);
}

}  // namespace

std::uint32_t FilePathAccessRules::GetPermission(std::string perms) {
  if (perms.size() > kPermissions.size()) {
    throw TavonException("Please enter the permissions from [rwx].");
  }
  std::uint32_t bits = 0;
  for (const char letter : perms) {
    const Permission& permission = FindPermission(letter);
    if ((bits & permission.bit) != 0) throw TavonException(permission.repeated);
    bits |= permission.bit;
  }
  return bits;
}

void FilePathAccessRules::AddRule(unsigned int line, std::string domainName, unsigned int domainId,
                                  std::queue<std::string> args, ZekAccessInterfaceImpl&) try {
  if (args.empty() || args.size() > 2) RuleSizeError();
  ZekAccess_FilePathAccessRule rule{line, domainId, domainName, args.front(), ""};
  if (args.size() == 2) rule.permissions = args.back();
  rules_.push_back(std::move(rule));
} catch (const TavonException& failure) {
  ThrowDomainParseError(line, domainName, failure.what());
}

void FilePathAccessRules::Set(ZekAccessInterfaceImpl&) {
  for (const ZekAccess_FilePathAccessRule& rule : rules_) {
    try {
      SetRule(rule);
    } catch (const TavonException& failure) {
      ThrowDomainSetError(rule.line, rule.domainName, failure.what());
    }
  }
}

void FilePathAccessRules::ReadSystemRules(unsigned int domainId, ZekAccessInterfaceImpl& iface) {
  iface.GetFilePathAccessRules(domainId, rules_);
}

void FilePathAccessRules::CheckConstraints(std::string, ZekAccessInterfaceImpl&) {}

void FilePathAccessRules::PrintRules() {
  for (const ZekAccess_FilePathAccessRule& rule : rules_) {
    PrintLine(Keyword() + " " + rule.path + " " + rule.permissions);
  }
}

}  // namespace SecPolicy
