// Rule records through the access library: set, held, read back.
#include <list>

#include "tests/host/access/access_fixture.h"

namespace StandIn {
namespace {

using namespace ZekCtl::Security;

// A record's fields in their binding order, but for those that all have.
std::string Words(const ZekAccess_SyscallRule& rule) { return rule.syscall; }
std::string Words(const ZekAccess_CapabilityRule& rule) { return rule.capability; }
std::string Words(const ZekAccess_CapabilityParamRule& rule) {
  return rule.capability + " " + rule.parameter;
}
std::string Words(const ZekAccess_ObjectAccessRule& rule) {
  return rule.object + " " + rule.access;
}
std::string Words(const ZekAccess_UnixSockCreationRule& rule) {
  return rule.label + " " + rule.sockType;
}
std::string Words(const ZekAccess_FileCreationRule& rule) {
  return rule.parentLabel + " " + rule.fileLabel + " " + rule.fileType;
}
std::string Words(const ZekAccess_DomTransRule& rule) {
  return rule.label + " " + rule.targetDomain + "(" + std::to_string(rule.targetDomainId) + ") " +
         rule.transition;
}

template <typename Record>
std::string Text(const Record& rule) {
  return "line " + std::to_string(rule.line) + " of " + rule.domainName + "(" +
         std::to_string(rule.domainId) + "): " + Words(rule) + (rule.grant ? " grant" : " revoke");
}

class RuleRecordTest : public AccessTest {
 protected:
  // Sets the rule as one of netDom, whose id is 1; how it is traced, and how it is read again.
  template <typename Record>
  std::string SetAndGet(Record rule, void (ZekAccessInterfaceImpl::*set)(Record),
                        void (ZekAccessInterfaceImpl::*get)(unsigned int, std::list<Record>&)) {
    Make("netDom");
    ZekAccessInterfaceImpl iface;
    rule.domainId = 1;
    const std::string traced = TraceOf([&] { (iface.*set)(rule); });
    std::list<Record> rules;
    (iface.*get)(1, rules);
    return rules.size() == 1 ? traced + "\n" + Text(rules.front()) : traced;
  }
};

TEST_F(RuleRecordTest, SystemCall) {
  EXPECT_EQ(SetAndGet<ZekAccess_SyscallRule>({4, 0, "", "open", true},
                                             &ZekAccessInterfaceImpl::SetSyscallRule,
                                             &ZekAccessInterfaceImpl::GetSyscallRules),
            "set-rule netDom -s open grant # line 4\nline 4 of netDom(1): open grant");
}

TEST_F(RuleRecordTest, Capability) {
  EXPECT_EQ(SetAndGet<ZekAccess_CapabilityRule>({5, 0, "", "net_admin", false},
                                                &ZekAccessInterfaceImpl::SetCapabilityRule,
                                                &ZekAccessInterfaceImpl::GetCapabilityRules),
            "set-rule netDom -c net_admin revoke # line 5\nline 5 of netDom(1): net_admin revoke");
}

TEST_F(RuleRecordTest, CapabilityParameter) {
  EXPECT_EQ(
      SetAndGet<ZekAccess_CapabilityParamRule>({6, 0, "", "net_bind", "80", true},
                                               &ZekAccessInterfaceImpl::SetCapabilityParamRule,
                                               &ZekAccessInterfaceImpl::GetCapabilityParamRules),
      "set-rule netDom -p net_bind 80 grant # line 6\nline 6 of netDom(1): net_bind 80 grant");
}

TEST_F(RuleRecordTest, ObjectAccess) {
  EXPECT_EQ(
      SetAndGet<ZekAccess_ObjectAccessRule>({7, 0, "", "default", "read", true},
                                            &ZekAccessInterfaceImpl::SetObjectAccessRule,
                                            &ZekAccessInterfaceImpl::GetObjectAccessRules),
      "set-rule netDom -a default read grant # line 7\nline 7 of netDom(1): default read grant");
}

TEST_F(RuleRecordTest, DomainTransition) {
  EXPECT_EQ(SetAndGet<ZekAccess_DomTransRule>({8, 0, "", "tardisk", "netDom", 1, "exec", true},
                                              &ZekAccessInterfaceImpl::SetDomTransRule,
                                              &ZekAccessInterfaceImpl::GetDomTransRules),
            "set-rule netDom -d tardisk netDom exec grant # line 8 into 1\n"
            "line 8 of netDom(1): tardisk netDom(1) exec grant");
}

TEST_F(RuleRecordTest, FileCreation) {
  EXPECT_EQ(SetAndGet<ZekAccess_FileCreationRule>({9, 0, "", "default", "tardisk", "file", false},
                                                  &ZekAccessInterfaceImpl::SetFileCreationRule,
                                                  &ZekAccessInterfaceImpl::GetFileCreationRules),
            "set-rule netDom -f default tardisk file revoke # line 9\n"
            "line 9 of netDom(1): default tardisk file revoke");
}

TEST_F(RuleRecordTest, UnixSocketCreation) {
  EXPECT_EQ(
      SetAndGet<ZekAccess_UnixSockCreationRule>({10, 0, "", "default", "stream", true},
                                                &ZekAccessInterfaceImpl::SetUnixSockCreationRule,
                                                &ZekAccessInterfaceImpl::GetUnixSockCreationRules),
      "set-rule netDom -u default stream grant # line 10\n"
      "line 10 of netDom(1): default stream grant");
}

TEST_F(RuleRecordTest, FileRulesAreReadAsLetters) {
  const DomainId id = Make("netDom");
  AddFileRules(id, {{0, "/etc/a", 0x13}, {0, "/etc/b", 0}});
  std::list<ZekAccess_FilePathAccessRule> rules;
  ZekAccessInterfaceImpl().GetFilePathAccessRules(id, rules);
  std::string text;
  for (const auto& rule : rules) {
    text += std::to_string(rule.line) + " " + std::to_string(rule.domainId) + " " +
            rule.domainName + " " + rule.path + " " + rule.permissions + "\n";
  }
  EXPECT_EQ(text, "0 1 netDom /etc/a rwx\n0 1 netDom /etc/b \n");
}

TEST_F(RuleRecordTest, ReadersAppend) {
  const DomainId id = Make("netDom");
  Set(RuleType::kSyscall, id, {"open"});
  AddFileRules(id, {{0, "/etc/a", 0x1}});
  ZekAccessInterfaceImpl iface;
  std::list<ZekAccess_SyscallRule> rules(1);
  std::list<ZekAccess_FilePathAccessRule> paths(1);
  iface.GetSyscallRules(id, rules);
  iface.GetFilePathAccessRules(id, paths);
  EXPECT_EQ(rules.back().syscall, "open");
  EXPECT_EQ(paths.back().path, "/etc/a");
  EXPECT_EQ(rules.size() + paths.size(), 4u);
}

TEST_F(RuleRecordTest, RefusedRuleIsThePlatformsException) {
  ZekAccessInterfaceImpl iface;
  EXPECT_EQ(ErrorOf([&] {
              iface.SetSyscallRule({1, 77, "", "open", true});
            }),
            "no domain has the id 77");
  EXPECT_EQ(ErrorOf([&] {
              iface.SetSyscallRule({1, 0, "", "opne", true});
            }),
            "unknown system call \"opne\" (nearest: open)");
  std::list<ZekAccess_SyscallRule> rules;
  EXPECT_EQ(ErrorOf([&] { iface.GetSyscallRules(77, rules); }), "no domain has the id 77");
}

TEST_F(RuleRecordTest, ContradictionNamesBothLines) {
  ZekAccessInterfaceImpl iface;
  EXPECT_EQ(ErrorOf([&] {
              iface.CheckCapabilityParamRuleConstraints(
                  "netDom",
                  {{3, 1, "", "net_bind", "80", true}, {9, 1, "", "net_bind", "80", false}});
            }),
            "the capability \"net_bind\" with the parameter \"80\" of the domain \"netDom\" is "
            "granted on line 3 and revoked on line 9");
}

}  // namespace
}  // namespace StandIn
