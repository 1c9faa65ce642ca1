#include "tests/host/module/module_fixture.h"

namespace StandIn {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST_F(ModuleTest, FileRulesComeBackInTheOrderOfTheirPaths) {
  EXPECT_EQ(AddFileRules(0, {{0, "/b", 1}, {0, "/a", 0x13}, {0, "/c", 0}}), 3U);
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /b 1", "0 /a 19", "0 /c 0"));
  EXPECT_EQ(module_.CountFileRules(0), 3U);
}

TEST_F(ModuleTest, AnExistingPathGetsTheNewPermissionInItsPlace) {
  AddFileRules(0, {{0, "/b", 1}, {0, "/a", 1}});
  EXPECT_EQ(AddFileRules(0, {{0, "/b", 2}}), 1U);
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /b 2", "0 /a 1"));
}

TEST_F(ModuleTest, AnEmptyBatchIsTaken) { EXPECT_EQ(AddFileRules(0, {}), 0U); }

TEST_F(ModuleTest, EachDomainHasFileRulesOfItsOwn) {
  const DomainId app = Make("appDom");
  AddFileRules(0, {{0, "/a", 1}});
  EXPECT_THAT(FileRulesOf(app), IsEmpty());
  EXPECT_EQ(module_.CountFileRules(app), 0U);
}

TEST_F(ModuleTest, AWorldsRuleStandsBesideTheDomains) {
  module_.PlaceWorld(7, 0);
  AddFileRules(0, {{0, "/a", 1}, {7, "/a", 2}});
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /a 1", "7 /a 2"));
}

TEST_F(ModuleTest, ABatchIsTakenUpToTheFirstBadRule) {
  const DomainId app = Make("appDom");
  module_.PlaceWorld(7, app);
  const std::string longest = "/" + std::string(1982, 'p');
  const std::string nul("/a\0b", 4);
  struct Row {
    FileRule bad;
    std::string refusal;
  };
  const Row rows[] = {
      {{0, "a", 1}, "EINVAL: the path \"a\" is not absolute"},
      {{0, "", 1}, "EINVAL: the path \"\" is not absolute"},
      {{0, nul, 1}, "EINVAL: the path \"/a\\0b\" holds a NUL byte"},
      {{0, longest + "p", 1},
       "ENAMETOOLONG: the path \"" + longest + "p\" is longer than 1983 bytes"},
      {{0, "/x", 4}, "EINVAL: the permission 4 has unknown bits"},
      {{0, "/x", 0x80000001}, "EINVAL: the permission 2147483649 has unknown bits"},
      {{5, "/x", 1}, "ESRCH: no world has the id 5"},
      {{-5, "/x", 1}, "ESRCH: no world has the id -5"},
      {{7, "/x", 1}, "EINVAL: the world 7 runs in the domain \"appDom\", not in \"rootDom\""},
  };
  for (const Row& row : rows) {
    std::uint32_t taken = 99;
    EXPECT_EQ(RefusalOf([&] {
                module_.AddFileRules(0, {{0, longest, 1}, row.bad, {0, "/c", 1}}, taken);
              }),
              row.refusal);
    EXPECT_EQ(taken, 1U) << row.refusal;
    EXPECT_THAT(FileRulesOf(0), ElementsAre("0 " + longest + " 1")) << row.refusal;
  }
}

TEST_F(ModuleTest, NothingIsTakenForAnUnknownDomain) {
  std::uint32_t taken = 99;
  EXPECT_EQ(RefusalOf([&] {
              module_.AddFileRules(3, {{0, "/a", 1}}, taken);
            }),
            "ENOENT: no domain has the id 3");
  EXPECT_EQ(taken, 0U);
}

TEST_F(ModuleTest, AFullTableTakesOnlyPathsThatItHas) {
  AddFileRules(0, {{0, "/a", 1}, {0, "/b", 1}, {0, "/c", 1}});
  std::uint32_t taken = 99;
  EXPECT_EQ(RefusalOf([&] {
              module_.AddFileRules(0, {{0, "/a", 2}, {0, "/d", 1}}, taken);
            }),
            "ENOSPC: no room is left for the file rule \"/d\" of the domain \"rootDom\": it has 3");
  EXPECT_EQ(taken, 1U);
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /a 2", "0 /b 1", "0 /c 1"));
}

TEST_F(ModuleTest, FileRulesOfAnUnknownDomainCannotBeRead) {
  EXPECT_EQ(RefusalOf([&] { module_.FileRules(3); }), "ENOENT: no domain has the id 3");
  EXPECT_EQ(RefusalOf([&] { module_.CountFileRules(3); }), "ENOENT: no domain has the id 3");
}

TEST_F(ModuleTest, RemovingTakesTheRuleOfThatWorldOnly) {
  module_.PlaceWorld(7, 0);
  AddFileRules(0, {{0, "/a", 1}, {7, "/a", 2}});
  module_.RemoveFileRule(0, 0, "/a");
  EXPECT_THAT(FileRulesOf(0), ElementsAre("7 /a 2"));
  EXPECT_EQ(RefusalOf([&] { module_.RemoveFileRule(0, 0, "/a"); }),
            "ENOENT: the domain \"rootDom\" has no file rule for \"/a\"");
  EXPECT_EQ(RefusalOf([&] { module_.RemoveFileRule(8, 0, "/a"); }),
            "ENOENT: the world 8 of the domain \"rootDom\" has no file rule for \"/a\"");
  EXPECT_EQ(RefusalOf([&] { module_.RemoveFileRule(7, 3, "/a"); }),
            "ENOENT: no domain has the id 3");
  module_.RemoveFileRule(7, 0, "/a");
  EXPECT_THAT(FileRulesOf(0), IsEmpty());
}

TEST_F(ModuleTest, UpdatingChangesEveryWorldsRuleOfThePath) {
  const DomainId app = Make("appDom");
  module_.PlaceWorld(7, 0);
  AddFileRules(0, {{0, "/a", 1}, {7, "/a", 2}, {0, "/ab", 1}});
  AddFileRules(app, {{0, "/a", 1}});
  module_.UpdateFileRule(0, "/a", 0x10);
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /a 16", "7 /a 16", "0 /ab 1"));
  EXPECT_THAT(FileRulesOf(app), ElementsAre("0 /a 1"));
}

TEST_F(ModuleTest, UpdatingIsRefusedForWhatIsUnknown) {
  AddFileRules(0, {{0, "/a", 1}});
  EXPECT_EQ(RefusalOf([&] { module_.UpdateFileRule(3, "/a", 1); }),
            "ENOENT: no domain has the id 3");
  EXPECT_EQ(RefusalOf([&] { module_.UpdateFileRule(0, "/a", 8); }),
            "EINVAL: the permission 8 has unknown bits");
  EXPECT_EQ(RefusalOf([&] { module_.UpdateFileRule(0, "/b", 1); }),
            "ENOENT: the domain \"rootDom\" has no file rule for \"/b\"");
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /a 1"));
}

TEST_F(ModuleTest, ReplacingRenamesThePathInEveryDomainAndWorld) {
  const DomainId app = Make("appDom");
  module_.PlaceWorld(7, 0);
  AddFileRules(0, {{0, "/a", 1}, {0, "/b", 1}, {7, "/a", 2}});
  AddFileRules(app, {{0, "/a", 1}, {0, "/c", 1}});
  module_.ReplacePath("/a", "/z");
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /z 1", "0 /b 1", "7 /z 2"));
  EXPECT_THAT(FileRulesOf(app), ElementsAre("0 /z 1", "0 /c 1"));
  module_.RemoveFileRule(7, 0, "/z");
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /z 1", "0 /b 1"));
}

TEST_F(ModuleTest, ARuleThatHasTheNewPathIsReplaced) {
  module_.PlaceWorld(7, 0);
  AddFileRules(0, {{0, "/new", 1}, {0, "/old", 2}, {7, "/new", 0x10}});
  module_.ReplacePath("/old", "/new");
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /new 2", "7 /new 16"));
}

TEST_F(ModuleTest, ReplacingAPathByItselfChangesNothing) {
  AddFileRules(0, {{0, "/a", 1}});
  module_.ReplacePath("/a", "/a");
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /a 1"));
}

TEST_F(ModuleTest, ReplacingIsRefusedForWhatIsUnknownOrWillNotDo) {
  AddFileRules(0, {{0, "/a", 1}});
  EXPECT_EQ(RefusalOf([&] { module_.ReplacePath("/b", "/c"); }),
            "ENOENT: no file rule names the path \"/b\"");
  EXPECT_EQ(RefusalOf([&] { module_.ReplacePath("/b", "/b"); }),
            "ENOENT: no file rule names the path \"/b\"");
  EXPECT_EQ(RefusalOf([&] { module_.ReplacePath("/a", "c"); }),
            "EINVAL: the new path \"c\" is not absolute");
  const std::string tooLong = "/" + std::string(1983, 'p');
  EXPECT_EQ(RefusalOf([&] { module_.ReplacePath("/a", tooLong); }),
            "ENAMETOOLONG: the new path \"" + tooLong + "\" is longer than 1983 bytes");
  EXPECT_THAT(FileRulesOf(0), ElementsAre("0 /a 1"));
}

}  // namespace
}  // namespace StandIn
