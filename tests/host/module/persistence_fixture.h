// A simulated module to be saved, and another to be restored.
#pragma once

#include <string>

#include "tests/host/module/module_fixture.h"

namespace StandIn {

class PersistenceTest : public ModuleTest {
 protected:
  // A second module of the same description, into which the first one's contents are put.
  SimulatedModule& Restored() {
    copy_.Restore(module_.Save(), "kernel.json");
    return copy_;
  }
  void ExpectTheSameText() { EXPECT_EQ(Restored().Save(), module_.Save()); }

  // Something of every kind, with bytes that are no text.
  void Fill() {
    const DomainId app = Make("app%Dom \xff\x80");
    const DomainId gone = Make("gone");
    const DomainId guest = MakeAtRunTime("vm");
    module_.DestroyDomain(gone);
    module_.AddLabels({"l\xc3\xa4", "stale", "old"}, kObject);
    module_.AddLabels({"dom"}, kDomain);
    module_.SetFileLabel("/b\xfe", 5);
    module_.SetFileLabel("/a", 3);
    module_.RemoveLabels({"old", "stale"}, kObject);
    module_.AddService(0, "log");
    module_.AddService(app, "con\"sole");
    module_.AddService(app, "\x90");
    module_.SetDomainRole(DomainRole::kGlobalVM, guest);
    module_.SetDomainRole(DomainRole::kIoFilter, 0);
    module_.PlaceWorld(70, app);
    module_.PlaceWorld(9, guest);
    FillRules(app);
    AddFileRules(app, {{0, "/z", 0x13}, {70, "/a\x81", 0}, {0, "/a", 2}});
  }

  void FillRules(DomainId app) {
    SetTransition(0, "default", "app%Dom \xff\x80", 4294967295U);
    Set(RuleType::kSyscall, app, {"read"}, Decision::kGrant, 4);
    Set(RuleType::kSyscall, app, {"open"}, Decision::kRevoke, 5);
    Set(RuleType::kObjectAccess, app, {"l\xc3\xa4", "read"}, Decision::kGrant, 0);
    Set(RuleType::kCapability, app, {"sys_boot"});
    Set(RuleType::kCapabilityParam, app, {"net_bind", "\x01\xff 80%"});
    Set(RuleType::kFileCreation, app, {"default", "tardisk", "dir"});
    Set(RuleType::kUnixSocket, app, {"default", "stream"});
  }

  SimulatedModule copy_{ReadDescription(kDescription, "host.json"), processes_};
};

}  // namespace StandIn
