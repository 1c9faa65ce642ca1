#include "tests/host/module/module_fixture.h"

namespace StandIn {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST_F(ModuleTest, RootDomainStandsInSlotZeroFromTheStart) {
  EXPECT_EQ(module_.FindDomain("rootDom"), 0U);
  EXPECT_EQ(module_.DomainName(0), "rootDom");
}

TEST_F(ModuleTest, AnUnknownDomainIsNotFound) {
  EXPECT_EQ(module_.FindDomain("appDom"), std::nullopt);
}

TEST_F(ModuleTest, DomainsTakeTheLowestFreeSlot) {
  EXPECT_EQ(Make("a"), 1U);
  EXPECT_EQ(Make("b"), 2U);
  EXPECT_EQ(Make("c"), 3U);
  module_.DestroyDomain(2);
  module_.DestroyDomain(1);
  EXPECT_EQ(Make("d"), 1U);
  EXPECT_EQ(Make("e"), 2U);
  EXPECT_EQ(Make("f"), 4U);
  EXPECT_EQ(module_.FindDomain("d"), 1U);
}

TEST_F(ModuleTest, ADestroyedDomainIsGone) {
  Make("appDom");
  module_.DestroyDomain(1);
  EXPECT_EQ(module_.FindDomain("appDom"), std::nullopt);
  EXPECT_EQ(module_.GetDomainInfo(1), std::nullopt);
  EXPECT_EQ(RefusalOf([&] { module_.DomainName(1); }), "ENOENT: no domain has the id 1");
}

TEST_F(ModuleTest, NamesOfDomainsAreJudged) {
  struct Row {
    std::string name;
    std::string refusal;
  };
  const std::string longest(127, 'n');
  const Row rows[] = {
      {longest, "(done)"},
      {"a name/with %\xff", "(done)"},
      {longest + "n",
       "ENAMETOOLONG: the domain name \"" + longest + "n\" is longer than 127 bytes"},
      {"", "EINVAL: the domain name \"\" is empty"},
      {std::string("a\0b", 3), "EINVAL: the domain name \"a\\0b\" holds a NUL byte"},
      {"rootDom", "EEXIST: a domain named \"rootDom\" exists already"},
      {longest, "EEXIST: a domain named \"" + longest + "\" exists already"},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(RefusalOf([&] { Make(row.name); }), row.refusal) << row.name;
  }
}

TEST_F(ModuleTest, NoDomainIsMadeWhenEverySlotIsTaken) {
  EXPECT_EQ(module_.MaxDomains(), 5U);
  for (const char* name : {"a", "b", "c", "d"}) {
    Make(name);
  }
  EXPECT_EQ(RefusalOf([&] { Make("x"); }),
            "ENOSPC: no slot is free for the domain \"x\": all 5 are taken");
  module_.DestroyDomain(3);
  EXPECT_EQ(Make("x"), 3U);
}

TEST_F(ModuleTest, ATakenNameIsSaidBeforeAFullTable) {
  for (const char* name : {"a", "b", "c", "d"}) {
    Make(name);
  }
  EXPECT_EQ(RefusalOf([&] { Make("a"); }), "EEXIST: a domain named \"a\" exists already");
}

TEST_F(ModuleTest, RootDomainCannotBeDestroyed) {
  EXPECT_EQ(RefusalOf([&] { module_.DestroyDomain(0); }),
            "EBUSY: the domain \"rootDom\" is predefined and stays");
}

TEST_F(ModuleTest, AnUnknownDomainCannotBeDestroyed) {
  EXPECT_EQ(RefusalOf([&] { module_.DestroyDomain(7); }), "ENOENT: no domain has the id 7");
}

TEST_F(ModuleTest, ADomainWithWorldsCannotBeDestroyed) {
  Make("appDom");
  module_.PlaceWorld(7, 1);
  EXPECT_EQ(RefusalOf([&] { module_.DestroyDomain(1); }),
            "EBUSY: the domain \"appDom\" has 1 world running in it");
  module_.PlaceWorld(8, 1);
  EXPECT_EQ(RefusalOf([&] { module_.DestroyDomain(1); }),
            "EBUSY: the domain \"appDom\" has 2 worlds running in it");
  EXPECT_EQ(module_.DomainName(1), "appDom");
  module_.PlaceWorld(7, 0);
  module_.PlaceWorld(8, 0);
  EXPECT_EQ(RefusalOf([&] { module_.DestroyDomain(1); }), "(done)");
}

TEST_F(ModuleTest, ADescribedWorldKeepsItsDomain) {
  Make("guestDom");
  EXPECT_EQ(RefusalOf([&] { module_.DestroyDomain(1); }),
            "EBUSY: the domain \"guestDom\" has 2 worlds running in it");
}

TEST_F(ModuleTest, InfoOfARootDomainAndOfAFreeSlot) {
  const auto info = module_.GetDomainInfo(0);
  ASSERT_TRUE(info.has_value());
  EXPECT_EQ(info->name, "rootDom");
  EXPECT_EQ(info->enforcementLevel, "permissive");
  EXPECT_EQ(info->state, 1U);
  EXPECT_EQ(info->worldRefCount, 1U);
  EXPECT_EQ(info->refCount, 1U);
  EXPECT_EQ(module_.GetDomainInfo(1), std::nullopt);
  EXPECT_EQ(module_.GetDomainInfo(4000000000U), std::nullopt);
}

TEST_F(ModuleTest, ReferencesAreWorldsAndTransitionsIntoTheDomain) {
  const DomainId app = Make("appDom");
  const DomainId other = Make("otherDom");
  module_.PlaceWorld(7, app);
  SetTransition(0, "default", "appDom");
  SetTransition(other, "default", "appDom");
  SetTransition(other, "default", "appDom");  // the same words: one transition
  SetTransition(app, "default", "appDom");
  SetTransition(app, "default", "otherDom");
  EXPECT_EQ(module_.GetDomainInfo(app)->worldRefCount, 1U);
  EXPECT_EQ(module_.GetDomainInfo(app)->refCount, 4U);
  module_.DestroyDomain(other);
  EXPECT_EQ(module_.GetDomainInfo(app)->refCount, 3U);
}

TEST_F(ModuleTest, ATransitionGivenAnotherTargetIsCountedThere) {
  const DomainId a = Make("a");
  const DomainId b = Make("b");
  const std::vector<std::string> words{"default", "a", "exec"};
  module_.SetRule(RuleType::kTransition, 0, {1, words, a, Decision::kGrant});
  module_.SetRule(RuleType::kTransition, 0, {2, words, b, Decision::kGrant});
  EXPECT_EQ(module_.GetDomainInfo(a)->refCount, 0U);
  EXPECT_EQ(module_.GetDomainInfo(b)->refCount, 1U);
  EXPECT_EQ(module_.Rules(RuleType::kTransition, 0)[0].targetDomain, b);
}

TEST_F(ModuleTest, ALeakedDomainIsARunTimeOneWithoutWorldsWhoseMakerEnded) {
  Make("ofPolicy");
  MakeAtRunTime("leaked");
  const DomainId inhabited = MakeAtRunTime("inhabited");
  processes_.self = {200, 6000};
  MakeAtRunTime("owned");
  module_.PlaceWorld(7, inhabited);
  EXPECT_THAT(module_.LeakedDomains(), IsEmpty());
  processes_.ended = {100};
  EXPECT_THAT(module_.LeakedDomains(), ElementsAre(2U));
  module_.PlaceWorld(7, 0);
  processes_.ended = {100, 200};
  EXPECT_THAT(module_.LeakedDomains(), ElementsAre(2U, 3U, 4U));
}

TEST_F(ModuleTest, ADestroyedDomainIsNotLeaked) {
  MakeAtRunTime("leaked");
  processes_.ended = {100};
  module_.DestroyDomain(1);
  EXPECT_THAT(module_.LeakedDomains(), IsEmpty());
}

TEST_F(ModuleTest, RolesAndServicesNeedADomain) {
  EXPECT_EQ(RefusalOf([&] { module_.SetDomainRole(DomainRole::kGlobalVM, 1); }),
            "ENOENT: no domain has the id 1");
  EXPECT_EQ(RefusalOf([&] { module_.AddService(1, "console"); }), "ENOENT: no domain has the id 1");
  EXPECT_EQ(RefusalOf([&] { module_.AddService(0, ""); }), "EINVAL: the service \"\" is empty");
}

TEST_F(ModuleTest, AnythingOfADestroyedDomainIsUnknownToTheNextInItsSlot) {
  const DomainId app = Make("appDom");
  const std::string before = module_.Save();
  module_.AddService(app, "console");
  module_.SetDomainRole(DomainRole::kIoFilter, app);
  Set(RuleType::kSyscall, app, {"open"});
  SetTransition(0, "default", "appDom");
  AddFileRules(app, {{0, "/a", 1}});
  EXPECT_NE(module_.Save(), before);
  module_.DestroyDomain(app);
  EXPECT_EQ(Make("appDom"), app);
  EXPECT_EQ(module_.Save(), before);
}

TEST_F(ModuleTest, AServiceAddedTwiceIsHeldOnce) {
  module_.AddService(0, "console");
  const std::string once = module_.Save();
  module_.AddService(0, "console");
  EXPECT_EQ(module_.Save(), once);
  EXPECT_THAT(once, testing::HasSubstr("\"services\": [\"console\"]"));
}

}  // namespace
}  // namespace StandIn
