// What the engine decides, one operation after the other.
#include "host/engine/engine.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "host/engine/accesses.h"

namespace StandIn {
namespace {

// Rules by their numbers, from 1 on.
class EngineTest : public testing::Test {
 protected:
  void Decide(RuleType type, const std::vector<std::string>& words, Decision decision) {
    rules_.Add(type, words, {decision == Decision::kGrant, 0, ++last_});
  }
  void Grant(RuleType type, const std::vector<std::string>& words) {
    Decide(type, words, Decision::kGrant);
  }
  void Revoke(RuleType type, const std::vector<std::string>& words) {
    Decide(type, words, Decision::kRevoke);
  }
  void Path(const std::string& path, std::uint32_t permission) {
    rules_.Add(RuleType::kPath, {path}, {false, permission, ++last_});
  }

  // "allowed by 3", "denied by no rule", "allowed, a denial by 2".
  static std::string Text(const Verdict& verdict) {
    std::string text = verdict.isAllowed ? "allowed" : "denied";
    if (verdict.isAllowed == verdict.isDenial) text += ", a denial";
    return text + " by " + (verdict.rule ? std::to_string(*verdict.rule) : "no rule");
  }
  static std::string Text(const TransitionVerdict& verdict) {
    return Text(static_cast<const Verdict&>(verdict)) +
           (verdict.domain
                ? ", to " + *verdict.domain + " by " + std::to_string(*verdict.transition)
                : ", stays");
  }
  static std::string Text(const CreationVerdict& verdict) {
    return Text(static_cast<const Verdict&>(verdict)) + ", " + verdict.label.value_or("no label");
  }

  [[nodiscard]] std::string Access(const std::string& access, const FileObject& file) const {
    return Text(DecideAccess(Of(), access, file));
  }
  [[nodiscard]] Subject Of(Level level = Level::kEnforcing) const { return {rules_, level}; }

  DomainRules rules_;

 private:
  std::size_t last_ = 0;
};

TEST(AccessesTest, LettersCoverTheirAccesses) {
  for (const char* access : {"read", "getattr"}) EXPECT_EQ(PermissionFor(access), 0x1U) << access;
  for (const char* access : {"write", "append", "create", "delete", "rename", "setattr"}) {
    EXPECT_EQ(PermissionFor(access), 0x2U) << access;
  }
  EXPECT_EQ(PermissionFor("exec"), 0x10U);
  for (const char* access : {"connect", "", "Read", "reads"}) {
    EXPECT_EQ(PermissionFor(access), std::nullopt) << access;
  }
}

TEST_F(EngineTest, TheLongestPathRuleDecidesOnAFile) {
  Path("/", 0x1);
  Path("/srv/", 0x3);
  Path("/srv/bin", 0x11);
  Path("/srv/none", 0);
  EXPECT_EQ(Access("read", {"/etc", "default"}), "allowed by 1");
  EXPECT_EQ(Access("write", {"/etc", "default"}), "denied by 1");
  EXPECT_EQ(Access("setattr", {"/srv", "default"}), "allowed by 2");
  EXPECT_EQ(Access("rename", {"/srv/a", "default"}), "allowed by 2");
  EXPECT_EQ(Access("exec", {"/srv/bind", "default"}), "denied by 2");
  EXPECT_EQ(Access("exec", {"/srv/bin/tool", "default"}), "allowed by 3");
  EXPECT_EQ(Access("getattr", {"/srv/none/a", "default"}), "denied by 4");
}

TEST_F(EngineTest, ALabelDecidesWhereNoPathRuleSpeaks) {
  Path("/srv", 0x13);
  Grant(RuleType::kObjectAccess, {"conf", "read"});
  Revoke(RuleType::kObjectAccess, {"conf", "write"});
  Grant(RuleType::kObjectAccess, {"conf", "connect"});
  EXPECT_EQ(Access("read", {"/etc/a", "conf"}), "allowed by 2");
  EXPECT_EQ(Access("write", {"/etc/a", "conf"}), "denied by 3");
  EXPECT_EQ(Access("append", {"/etc/a", "conf"}), "denied by no rule");
  EXPECT_EQ(Access("read", {"/etc/a", std::nullopt}), "denied by no rule");
  EXPECT_EQ(Access("write", {"/srv/a", "conf"}), "allowed by 1");
  EXPECT_EQ(Text(DecideConnection(Of(), {"/srv/a", "conf"})), "allowed by 4");
  EXPECT_EQ(Text(DecideConnection(Of(), {"/srv/a", "other"})), "denied by no rule");
}

TEST_F(EngineTest, ALaterRuleReplacesAnEarlierOne) {
  Path("/srv", 0x1);
  Grant(RuleType::kSyscall, {"open"});
  Path("/srv//", 0x2);
  Revoke(RuleType::kSyscall, {"open"});
  EXPECT_EQ(Access("read", {"/srv", std::nullopt}), "denied by 3");
  EXPECT_EQ(Text(DecideSystemCall(Of(), "open")), "denied by 4");
}

TEST_F(EngineTest, ANewFileGetsTheLabelOfTheFirstGrantedRule) {
  Grant(RuleType::kObjectAccess, {"logs", "create"});
  Revoke(RuleType::kFileCreation, {"logs", "secret", "file"});
  Grant(RuleType::kFileCreation, {"logs", "old", "file"});
  Grant(RuleType::kFileCreation, {"logs", "new", "file"});
  Revoke(RuleType::kFileCreation, {"logs", "old", "dir"});
  const FileObject logs{"/var/log", "logs"};
  EXPECT_EQ(Text(DecideCreation(Of(), "file", logs)), "allowed by 3, old");
  EXPECT_EQ(Text(DecideCreation(Of(), "dir", logs)), "denied by 5, no label");
  EXPECT_EQ(Text(DecideCreation(Of(), "fifo", logs)), "denied by no rule, no label");
  EXPECT_EQ(Text(DecideCreation(Of(), "file", {"/etc", "conf"})), "denied by no rule, no label");
}

TEST_F(EngineTest, ANewFileNeedsAccessToItsDirectory) {
  Grant(RuleType::kFileCreation, {"logs", "old", "file"});
  Path("/var/log/kept", 0x1);
  Path("/srv", 0x2);
  EXPECT_EQ(Text(DecideCreation(Of(), "file", {"/var/log", "logs"})),
            "denied by no rule, no label");
  EXPECT_EQ(Text(DecideCreation(Of(), "file", {"/var/log/kept", "logs"})), "denied by 2, no label");
  EXPECT_EQ(Text(DecideCreation(Of(), "file", {"/srv/a", "logs"})), "allowed by 1, old");
  EXPECT_EQ(Text(DecideCreation(Of(), "file", {"/srv/a", std::nullopt})),
            "denied by no rule, no label");
}

TEST_F(EngineTest, SocketsAndSystemCallsHaveRulesOfTheirOwn) {
  Grant(RuleType::kUnixSocket, {"run", "stream"});
  Revoke(RuleType::kUnixSocket, {"run", "dgram"});
  Grant(RuleType::kSyscall, {"open"});
  EXPECT_EQ(Text(DecideSocket(Of(), "stream", "run")), "allowed by 1");
  EXPECT_EQ(Text(DecideSocket(Of(), "dgram", "run")), "denied by 2");
  EXPECT_EQ(Text(DecideSocket(Of(), "stream", "conf")), "denied by no rule");
  EXPECT_EQ(Text(DecideSystemCall(Of(), "open")), "allowed by 3");
  EXPECT_EQ(Text(DecideSystemCall(Of(), "close")), "denied by no rule");
}

TEST_F(EngineTest, ARuleForTheParameterComesBeforeTheCapabilitys) {
  Grant(RuleType::kCapability, {"net_bind_service"});
  Revoke(RuleType::kCapabilityParam, {"net_bind_service", "tcp/25"});
  Revoke(RuleType::kCapability, {"sys_admin"});
  Grant(RuleType::kCapabilityParam, {"sys_admin", "mount"});
  const auto decide = [&](const char* capability, const std::optional<std::string>& parameter) {
    return Text(DecideCapability(Of(), capability, parameter));
  };
  EXPECT_EQ(decide("net_bind_service", "tcp/25"), "denied by 2");
  EXPECT_EQ(decide("net_bind_service", "tcp/80"), "allowed by 1");
  EXPECT_EQ(decide("net_bind_service", std::nullopt), "allowed by 1");
  EXPECT_EQ(decide("sys_admin", "mount"), "allowed by 4");
  EXPECT_EQ(decide("sys_admin", "swapon"), "denied by 3");
  EXPECT_EQ(decide("chown", "fchown"), "denied by no rule");
}

TEST_F(EngineTest, ExecMovesAProgramByTheFirstGrantedTransition) {
  Path("/bin", 0x11);
  Revoke(RuleType::kTransition, {"tool", "offDom", "exec"});
  Grant(RuleType::kTransition, {"tool", "firstDom", "exec"});
  Grant(RuleType::kTransition, {"tool", "laterDom", "exec"});
  Grant(RuleType::kTransition, {"tool", "forkDom", "fork"});
  Revoke(RuleType::kTransition, {"shell", "offDom", "exec"});
  EXPECT_EQ(Text(DecideExec(Of(), {"/bin/a", "tool"})), "allowed by 1, to firstDom by 3");
  EXPECT_EQ(Text(DecideExec(Of(), {"/bin/sh", "shell"})), "allowed by 1, stays");
  EXPECT_EQ(Text(DecideExec(Of(), {"/bin/x", std::nullopt})), "allowed by 1, stays");
  EXPECT_EQ(Text(DecideExec(Of(), {"/srv/a", "tool"})), "denied by no rule, stays");
}

TEST_F(EngineTest, ForkIsAllowedAndMovesTheNewProcess) {
  Grant(RuleType::kTransition, {"tool", "forkDom", "fork"});
  Revoke(RuleType::kTransition, {"shell", "offDom", "fork"});
  EXPECT_EQ(Text(DecideFork(Of(), {"/bin/a", "tool"})), "allowed by no rule, to forkDom by 1");
  EXPECT_EQ(Text(DecideFork(Of(), {"/bin/sh", "shell"})), "allowed by no rule, stays");
}

TEST_F(EngineTest, APermissiveDomainIsAllowedWhatIsRecordedAsADenial) {
  Path("/srv", 0x1);
  Grant(RuleType::kTransition, {"tool", "toolDom", "exec"});
  const Subject subject = Of(Level::kPermissive);
  EXPECT_EQ(Text(DecideAccess(subject, "read", {"/srv", "conf"})), "allowed by 1");
  EXPECT_EQ(Text(DecideAccess(subject, "write", {"/srv", "conf"})), "allowed, a denial by 1");
  EXPECT_EQ(Text(DecideSystemCall(subject, "open")), "allowed, a denial by no rule");
  EXPECT_EQ(Text(DecideExec(subject, {"/srv/a", "tool"})),
            "allowed, a denial by 1, to toolDom by 2");
  EXPECT_EQ(Text(DecideCreation(subject, "file", {"/srv", "conf"})),
            "allowed, a denial by 1, no label");
}

TEST_F(EngineTest, AnUnconfinedDomainIsNotJudgedByItsRules) {
  Path("/srv", 0);
  Grant(RuleType::kTransition, {"tool", "toolDom", "exec"});
  Grant(RuleType::kFileCreation, {"conf", "made", "file"});
  const Subject subject = Of(Level::kUnconfined);
  EXPECT_EQ(Text(DecideAccess(subject, "write", {"/srv", "conf"})), "allowed by no rule");
  EXPECT_EQ(Text(DecideCapability(subject, "sys_admin", "mount")), "allowed by no rule");
  EXPECT_EQ(Text(DecideExec(subject, {"/srv/a", "tool"})), "allowed by no rule, to toolDom by 2");
  EXPECT_EQ(Text(DecideCreation(subject, "file", {"/srv", "conf"})), "allowed by no rule, made");
}

TEST(LevelTest, OnlyTheRootDomainStartsUnconfined) {
  EXPECT_EQ(StartingLevel(0), Level::kUnconfined);
  EXPECT_EQ(StartingLevel(1), Level::kEnforcing);
  EXPECT_EQ(StartingLevel(1023), Level::kEnforcing);
}

}  // namespace
}  // namespace StandIn
