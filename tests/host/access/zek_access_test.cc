// The access library on the module: domains, words, labels, and what refusals become.
#include <new>

#include "tests/host/access/access_fixture.h"

namespace StandIn {
namespace {

using namespace ZekCtl::Security;
using testing::ElementsAre;
using testing::IsEmpty;

class ZekAccessTest : public AccessTest {
 protected:
  // How often an operation was traced.
  [[nodiscard]] long Count(const std::string& line) const {
    return std::count(lines_.begin(), lines_.end(), line);
  }
};

TEST_F(ZekAccessTest, InterfaceIsOpenedAndClosed) {
  {
    ZekAccessInterfaceImpl iface;
    EXPECT_THAT(lines_, ElementsAre("open-interface"));
  }
  EXPECT_THAT(lines_, ElementsAre("open-interface", "close-interface"));
}

TEST_F(ZekAccessTest, OpeningCanBeRefusedAndClosesNothing) {
  faults_.Add({.operation = Operation::kOpenInterface});
  EXPECT_EQ(ErrorOf([] { ZekAccessInterfaceImpl iface; }),
            "refused on request: open-interface, call 1");
  EXPECT_EQ(Count("close-interface"), 0);
}

TEST_F(ZekAccessTest, ClosingCannotBeRefused) {
  faults_.Add({.operation = Operation::kCloseInterface});
  EXPECT_NO_THROW({ ZekAccessInterfaceImpl iface; });
  EXPECT_EQ(Count("close-interface ! refused on request: close-interface, call 1"), 1);
}

TEST_F(ZekAccessTest, WithoutAHostItCannotBeOpened) {
  Attach(nullptr);
  EXPECT_EQ(ErrorOf([] { ZekAccessInterfaceImpl iface; }),
            "the kernel's security module cannot be reached: no host has been entered");
}

TEST_F(ZekAccessTest, UnknownDomainLeavesTheIdAlone) {
  ZekAccessInterfaceImpl iface;
  unsigned int id = 99;
  EXPECT_FALSE(iface.FindDomain("netDom", &id));
  EXPECT_EQ(id, 99u);
  Make("netDom");
  EXPECT_TRUE(iface.FindDomain("netDom", &id));
  EXPECT_EQ(id, 1u);
}

TEST_F(ZekAccessTest, DomainInfoIsComplete) {
  const DomainId id = Make("netDom");
  module_.PlaceWorld(9, id);
  SetTransition(0, "default", "netDom");
  std::string name;
  std::string level;
  unsigned int state = 0;
  unsigned int references = 0;
  unsigned int worlds = 0;
  EXPECT_TRUE(
      ZekAccessInterfaceImpl().GetCompleteDomainInfo(id, name, level, state, references, worlds));
  EXPECT_EQ(name + " " + level, "netDom permissive");
  EXPECT_EQ(state, 1u);
  EXPECT_EQ(references, 2u);
  EXPECT_EQ(worlds, 1u);
}

TEST_F(ZekAccessTest, InfoOfAFreeSlotFillsNothingIn) {
  std::string name = "as";
  std::string level = "before";
  unsigned int state = 7;
  unsigned int references = 8;
  unsigned int worlds = 9;
  EXPECT_FALSE(
      ZekAccessInterfaceImpl().GetCompleteDomainInfo(3, name, level, state, references, worlds));
  EXPECT_EQ(name + level, "asbefore");
  EXPECT_EQ(state + references + worlds, 24u);
}

TEST_F(ZekAccessTest, RolesAndServicesReachTheModule) {
  Make("netDom");
  ZekAccessInterfaceImpl iface;
  EXPECT_EQ(iface.GetMaxDomains(), 5u);
  iface.SetGlobalVMDomain(1);
  iface.SetIoFilterDomain(0);
  iface.AddUlvoService(1, "console");
  EXPECT_THAT(lines_, ElementsAre("open-interface", "max-domains", "set-global-vm-domain netDom",
                                  "set-io-filter-domain rootDom", "add-service netDom console"));
}

TEST_F(ZekAccessTest, WordListsHaveTheirNumbers) {
  struct Row {
    ZekAccess_KeywordType type;
    const char* word;
  };
  ZekAccessInterfaceImpl iface;
  for (const Row& row :
       {Row{kObjectKeyword, "default"}, Row{kCapabilityKeyword, "sys_boot"},
        Row{kCapabilityParamKeyword, "net_bind"}, Row{kObjectAccessKeyword, "write"},
        Row{kTransitionKeyword, "exec"}, Row{kFileTypeKeyword, "dir"},
        Row{kSockTypeKeyword, "stream"}, Row{kSyscallKeyword, "close"}}) {
    EXPECT_NO_THROW(iface.ValidateKeyword(row.type, row.word)) << row.word;
    EXPECT_EQ(iface.GetKeywordsMap(row.type).count(row.word), 1u) << row.word;
  }
  EXPECT_EQ(ErrorOf([&] { iface.ValidateKeyword(kCapabilityKeyword, "net_bind"); }),
            "unknown capability \"net_bind\"");
}

TEST_F(ZekAccessTest, NumberThatIsNoListIsRefused) {
  ZekAccessInterfaceImpl iface;
  EXPECT_EQ(ErrorOf([&] { iface.ValidateKeyword(static_cast<ZekAccess_KeywordType>(9), "read"); }),
            "no word list has the number 9");
}

TEST_F(ZekAccessTest, Labels) {
  ZekAccessInterfaceImpl iface;
  iface.AddLabels({"conf", "data", "stale"}, kObjectLabel);
  iface.RemoveLabels({"conf"}, kObjectLabel);
  iface.AddLabels({"guest"}, kDomainLabel);
  EXPECT_EQ(iface.GetLabel(iface.LookupLabel("data", kObjectLabel), kObjectLabel), "data");
  EXPECT_EQ(iface.GetLabel(iface.LookupLabel("guest", kDomainLabel), kDomainLabel), "guest");
  EXPECT_TRUE(iface.IsPredefinedLabel("any", kDomainLabel));
  EXPECT_FALSE(iface.IsPredefinedLabel("any", kObjectLabel));
  EXPECT_THAT(iface.GetInvalidLabels(kObjectLabel), ElementsAre("stale"));
  EXPECT_THAT(iface.GetInvalidLabels(kDomainLabel), IsEmpty());
  EXPECT_EQ(ErrorOf([&] { iface.LookupLabel("conf", kObjectLabel); }),
            "no object label is named \"conf\"");
}

TEST_F(ZekAccessTest, PrivilegedVmsAreThoseOfTheDescription) {
  ZekAccessInterfaceImpl iface;
  EXPECT_TRUE(iface.IsPrivilegedVm("control"));
  EXPECT_FALSE(iface.IsPrivilegedVm("guest"));
}

TEST_F(ZekAccessTest, TardiskWords) {
  ZekAccessInterfaceImpl iface;
  EXPECT_EQ(iface.GetTardiskLaunchDomain(), "rootDom");
  EXPECT_EQ(iface.GetTardiskExecEventKeyword(), "exec");
  EXPECT_EQ(iface.GetDefaultTardiskLabel(), "tardisk");
  EXPECT_EQ(iface.GetDefaultTardiskDomain(), "appDom");
}

TEST_F(ZekAccessTest, MemoryThatRunsOutStaysBadAlloc) {
  faults_.Add({.operation = Operation::kFindDomain, .kind = Fault::Kind::kOutOfMemory});
  ZekAccessInterfaceImpl iface;
  unsigned int id = 0;
  EXPECT_THROW(iface.FindDomain("netDom", &id), std::bad_alloc);
}

// Every operation of the interface but opening and closing it, with arguments that would do.
TEST_F(ZekAccessTest, EveryRefusalIsThePlatformsExceptionWithTheSameText) {
  struct Row {
    Operation operation;
    std::function<void(ZekAccessInterfaceImpl&)> call;
  };
  std::string text;
  unsigned int number = 0;
  const std::vector<Row> rows = {
      {Operation::kFindDomain, [&](auto& i) { i.FindDomain("a", &number); }},
      {Operation::kSetGlobalVMDomain, [](auto& i) { i.SetGlobalVMDomain(0); }},
      {Operation::kSetIoFilterDomain, [](auto& i) { i.SetIoFilterDomain(0); }},
      {Operation::kMaxDomains, [](auto& i) { i.GetMaxDomains(); }},
      {Operation::kDomainInfo,
       [&](auto& i) { i.GetCompleteDomainInfo(0, text, text, number, number, number); }},
      {Operation::kAddService, [](auto& i) { i.AddUlvoService(0, "s"); }},
      {Operation::kValidateWord, [](auto& i) { i.ValidateKeyword(kSyscallKeyword, "open"); }},
      {Operation::kWords, [](auto& i) { i.GetKeywordsMap(kSyscallKeyword); }},
      {Operation::kSetRule,
       [](auto& i) {
         i.SetSyscallRule({1, 0, "", "open", true});
       }},
      {Operation::kCheckCapabilityParams,
       [](auto& i) { i.CheckCapabilityParamRuleConstraints("a", {}); }},
      {Operation::kInvalidLabels, [](auto& i) { i.GetInvalidLabels(kObjectLabel); }},
      {Operation::kAddLabels, [](auto& i) { i.AddLabels({"a"}, kObjectLabel); }},
      {Operation::kRemoveLabels, [](auto& i) { i.RemoveLabels({"a"}, kObjectLabel); }},
      {Operation::kPredefinedLabel, [](auto& i) { i.IsPredefinedLabel("a", kObjectLabel); }},
      {Operation::kPrivilegedVm, [](auto& i) { i.IsPrivilegedVm("a"); }},
      {Operation::kLookupLabel, [](auto& i) { i.LookupLabel("default", kObjectLabel); }},
      {Operation::kLabelName, [](auto& i) { i.GetLabel(1, kObjectLabel); }},
      {Operation::kTardiskLaunchDomain, [](auto& i) { i.GetTardiskLaunchDomain(); }},
      {Operation::kTardiskExecEvent, [](auto& i) { i.GetTardiskExecEventKeyword(); }},
      {Operation::kDefaultTardiskLabel, [](auto& i) { i.GetDefaultTardiskLabel(); }},
      {Operation::kDefaultTardiskDomain, [](auto& i) { i.GetDefaultTardiskDomain(); }},
  };
  ZekAccessInterfaceImpl iface;
  for (const Row& row : rows) {
    faults_.Add({.operation = row.operation});
    EXPECT_EQ(ErrorOf([&] { row.call(iface); }),
              "refused on request: " + std::string(InfoOf(row.operation).name) + ", call 1");
  }
}

}  // namespace
}  // namespace StandIn
