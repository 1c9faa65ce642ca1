// Memory that runs out in the middle of an operation: the module holds what it held before.
#include "tests/host/module/module_fixture.h"
#include "tests/support/counted_memory.h"

namespace StandIn {
namespace {

using SecPolicyTest::AllocationFailed;
using SecPolicyTest::FailAllocation;
using SecPolicyTest::FailNoAllocation;

struct Change {
  const char* what;
  std::function<void(SecurityModule&)> make;
};

constexpr DomainId kADom = 1;
constexpr DomainId kBDom = 2;
// Too long to be kept without an allocation.
constexpr char kName[] = "a name that is longer than others";

// Of lists the simplest, of which no part can be done.
const Change kChanges[] = {
    {"create a domain", [](auto& module) { module.CreateDomain(kName, DomainOrigin::kRunTime); }},
    {"destroy a domain", [](auto& module) { module.DestroyDomain(kADom); }},
    {"role", [](auto& module) { module.SetDomainRole(DomainRole::kIoFilter, kADom); }},
    {"service", [](auto& module) { module.AddService(kADom, kName); }},
    {"world", [](auto& module) { module.PlaceWorld(4711, kADom); }},
    {"rule",
     [](auto& module) {
       module.SetRule(RuleType::kCapabilityParam, kADom, {5, {"ipc_lock", kName}});
     }},
    {"transition",
     [](auto& module) {
       module.SetRule(RuleType::kTransition, kADom, {6, {"default", kName, "exec"}, kADom});
     }},
    {"label", [](auto& module) { module.AddLabels({kName}, LabelType::kObject); }},
    {"obsolete label", [](auto& module) { module.RemoveLabels({"old"}, LabelType::kObject); }},
    {"file rule",
     [](auto& module) {
       std::uint32_t taken = 0;
       module.AddFileRules(kADom, {{0, "/a/path/that/is/longer/than/others", 1}}, taken);
     }},
    {"removed file rule", [](auto& module) { module.RemoveFileRule(0, kADom, "/old"); }},
    {"updated file rule", [](auto& module) { module.UpdateFileRule(kADom, "/old", 3); }},
    {"path",
     [](auto& module) { module.ReplacePath("/old", "/a/path/that/is/longer/than/others"); }},
    {"path that is there", [](auto& module) { module.ReplacePath("/old", "/there"); }},
    {"file label", [](auto& module) { module.SetFileLabel("/a/path/that/is/longer/too", 1); }},
};

class OutOfMemoryTest : public testing::Test {
 protected:
  // A module that holds something of everything.
  SimulatedModule Filled() const {
    SimulatedModule module(ReadDescription(DefaultDescriptionText(), "host.json"), processes_);
    module.CreateDomain("aDom", DomainOrigin::kPolicy);
    module.CreateDomain("bDom", DomainOrigin::kPolicy);
    module.SetRule(RuleType::kTransition, kADom, {1, {"default", "bDom", "exec"}, kBDom});
    module.SetRule(RuleType::kTransition, kBDom, {2, {"default", "aDom", "exec"}, kADom});
    module.AddLabels({"old"}, LabelType::kObject);
    std::uint32_t taken = 0;
    module.AddFileRules(kADom, {{0, "/old", 1}, {0, "/there", 2}}, taken);
    return module;
  }

  // What can be seen of the module beside what it saves.
  static std::string Seen(SimulatedModule& module) {
    std::string text = module.Save();
    for (const DomainId domain : {kADom, kBDom}) {
      const auto info = module.GetDomainInfo(domain);
      text += info ? " " + info->name + " " + std::to_string(info->refCount) : " none";
    }
    const auto found = module.FindDomain(kName);
    return found ? text + " " + std::to_string(*found) : text;
  }

  FakeProcessTable processes_;
};

TEST_F(OutOfMemoryTest, OperationIsDoneWhollyOrNotAtAll) {
  for (const Change& change : kChanges) {
    SCOPED_TRACE(change.what);
    SimulatedModule module = Filled();
    const std::string before = Seen(module);
    for (unsigned int allocation = 0;; ++allocation) {
      FailAllocation(allocation);
      try {
        change.make(module);
      } catch (const std::bad_alloc&) {
      }
      const bool failed = AllocationFailed();
      FailNoAllocation();
      if (!failed) break;
      ASSERT_EQ(Seen(module), before) << "allocation " << allocation;
    }
    SimulatedModule undisturbed = Filled();
    change.make(undisturbed);
    EXPECT_EQ(Seen(module), Seen(undisturbed));
  }
}

TEST_F(OutOfMemoryTest, RestoringIsDoneWhollyOrNotAtAll) {
  SimulatedModule source = Filled();
  source.CreateDomain(kName, DomainOrigin::kRunTime);
  source.SetFileLabel("/a/path/that/is/longer/too", 1);
  const std::string saved = source.Save();
  SimulatedModule module = Filled();
  const std::string before = Seen(module);
  unsigned int allocation = 0;
  for (;; ++allocation) {
    FailAllocation(allocation);
    try {
      module.Restore(saved, "kernel.json");
    } catch (const std::bad_alloc&) {
    }
    const bool failed = AllocationFailed();
    FailNoAllocation();
    if (!failed) break;
    ASSERT_EQ(Seen(module), before) << "allocation " << allocation;
  }
  EXPECT_GT(allocation, 100U);
  EXPECT_EQ(module.Save(), saved);
}

}  // namespace
}  // namespace StandIn
