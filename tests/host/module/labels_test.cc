#include "tests/host/module/module_fixture.h"

namespace StandIn {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

TEST_F(ModuleTest, PredefinedLabelsHaveTheFirstIdsInTheirOrder) {
  EXPECT_THAT(module_.Words(WordList::kObjects),
              ElementsAre(Pair("default", 1), Pair("tardisk", 2)));
  EXPECT_EQ(module_.LookupLabel("any", kDomain), 1U);
  EXPECT_TRUE(module_.IsPredefinedLabel("default", kObject));
  EXPECT_FALSE(module_.IsPredefinedLabel("default", kDomain));
  EXPECT_FALSE(module_.IsPredefinedLabel("logs", kObject));
}

TEST_F(ModuleTest, IdsOfLabelsAscendAndAreNeverGivenAgain) {
  module_.AddLabels({"b", "a"}, kObject);
  EXPECT_EQ(module_.LookupLabel("b", kObject), 3U);
  EXPECT_EQ(module_.LookupLabel("a", kObject), 4U);
  module_.RemoveLabels({"a"}, kObject);
  module_.AddLabels({"c", "a"}, kObject);
  EXPECT_EQ(module_.LookupLabel("c", kObject), 5U);
  EXPECT_EQ(module_.LookupLabel("a", kObject), 6U);
  EXPECT_EQ(module_.LabelName(6, kObject), "a");
}

TEST_F(ModuleTest, AnExistingLabelKeepsItsId) {
  module_.AddLabels({"a", "a", "default"}, kObject);
  EXPECT_THAT(module_.Words(WordList::kObjects),
              ElementsAre(Pair("a", 3), Pair("default", 1), Pair("tardisk", 2)));
}

TEST_F(ModuleTest, TheTypesOfLabelsAreApart) {
  module_.AddLabels({"a"}, kDomain);
  EXPECT_EQ(module_.LookupLabel("a", kDomain), 2U);
  EXPECT_EQ(RefusalOf([&] { module_.LookupLabel("a", kObject); }),
            "ENOENT: no object label is named \"a\"");
}

TEST_F(ModuleTest, RemovingAnUnknownLabelChangesNothing) {
  const std::string before = module_.Save();
  module_.RemoveLabels({"unknown"}, kObject);
  EXPECT_EQ(module_.Save(), before);
}

TEST_F(ModuleTest, APredefinedLabelCannotBeRemoved) {
  module_.AddLabels({"a", "b"}, kObject);
  EXPECT_EQ(RefusalOf([&] {
              module_.RemoveLabels({"a", "tardisk", "b"}, kObject);
            }),
            "EPERM: the object label \"tardisk\" is predefined and stays");
  EXPECT_THAT(module_.Words(WordList::kObjects),
              ElementsAre(Pair("b", 4), Pair("default", 1), Pair("tardisk", 2)))
      << "what stood before it in the list is removed";
}

TEST_F(ModuleTest, UnknownLabelsAreSaid) {
  EXPECT_EQ(RefusalOf([&] { module_.LookupLabel("x", kDomain); }),
            "ENOENT: no domain label is named \"x\"");
  EXPECT_EQ(RefusalOf([&] { module_.LabelName(3, kObject); }),
            "ENOENT: no object label has the id 3");
  EXPECT_EQ(RefusalOf([&] { module_.LabelName(0, kObject); }),
            "ENOENT: no object label has the id 0");
}

TEST_F(ModuleTest, NamesOfLabelsAreJudged) {
  struct Row {
    std::string name;
    std::string refusal;
  };
  const std::string longest(127, 'l');
  const Row rows[] = {
      {longest, "(done)"},
      {"\x80 %", "(done)"},
      {"", "EINVAL: the object label name \"\" is empty"},
      {longest + "l",
       "ENAMETOOLONG: the object label name \"" + longest + "l\" is longer than 127 bytes"},
      {std::string(1, '\0'), "EINVAL: the object label name \"\\0\" holds a NUL byte"},
  };
  for (const Row& row : rows) {
    EXPECT_EQ(RefusalOf([&] { module_.AddLabels({row.name}, kObject); }), row.refusal) << row.name;
  }
}

TEST_F(ModuleTest, LabelsBeyondTheLimitAreRefused) {
  EXPECT_EQ(RefusalOf([&] {
              module_.AddLabels({"a", "b", "c", "d", "e"}, kObject);
            }),
            "ENOSPC: no id is free for the object label \"e\": all 6 are taken");
  EXPECT_EQ(module_.LookupLabel("d", kObject), 6U) << "what stood before it is defined";
  EXPECT_EQ(RefusalOf([&] { module_.AddLabels({"a", "default"}, kObject); }), "(done)");
  module_.RemoveLabels({"a"}, kObject);
  module_.AddLabels({"e"}, kObject);
  EXPECT_EQ(module_.LookupLabel("e", kObject), 7U) << "the limit is of labels, not of ids";
}

TEST_F(ModuleTest, ALabelIsInvalidUntilItIsRemovedAndAddedAnew) {
  EXPECT_THAT(module_.InvalidLabels(kObject), IsEmpty()) << "not defined yet";
  module_.AddLabels({"staler", "logs", "stale"}, kObject);
  EXPECT_THAT(module_.InvalidLabels(kObject), ElementsAre("stale", "staler"));
  EXPECT_THAT(module_.InvalidLabels(kDomain), IsEmpty());
  module_.RemoveLabels({"stale"}, kObject);
  EXPECT_THAT(module_.InvalidLabels(kObject), ElementsAre("staler"));
  module_.AddLabels({"stale"}, kObject);
  EXPECT_THAT(module_.InvalidLabels(kObject), ElementsAre("staler"));
}

TEST_F(ModuleTest, RemovingALabelBeforeItWasDefinedDoesNotMakeItValid) {
  module_.RemoveLabels({"stale"}, kObject);
  module_.AddLabels({"stale"}, kObject);
  EXPECT_THAT(module_.InvalidLabels(kObject), ElementsAre("stale"));
}

TEST_F(ModuleTest, PrivilegedVmsAreThoseOfTheDescription) {
  EXPECT_TRUE(module_.IsPrivilegedVm("control"));
  EXPECT_FALSE(module_.IsPrivilegedVm("guest"));
}

TEST_F(ModuleTest, AnUnknownLabelTypeIsRefused) {
  const auto type = static_cast<LabelType>(2);
  const char* const refusal = "EINVAL: no label type has the number 2";
  EXPECT_EQ(RefusalOf([&] { module_.InvalidLabels(type); }), refusal);
  EXPECT_EQ(RefusalOf([&] { module_.AddLabels({}, type); }), refusal);
  EXPECT_EQ(RefusalOf([&] { module_.RemoveLabels({}, type); }), refusal);
  EXPECT_EQ(RefusalOf([&] { module_.IsPredefinedLabel("a", type); }), refusal);
  EXPECT_EQ(RefusalOf([&] { module_.LookupLabel("a", type); }), refusal);
  EXPECT_EQ(RefusalOf([&] { module_.LabelName(1, type); }), refusal);
}

// ---- Labels of files ----

TEST_F(ModuleTest, AFileCarriesTheDefaultLabelFromTheStart) {
  EXPECT_EQ(module_.FileLabel("/etc/motd"), module_.LookupLabel("default", kObject));
}

TEST_F(ModuleTest, AFileCarriesTheLabelSetLast) {
  module_.AddLabels({"logs"}, kObject);
  module_.SetFileLabel("/var/log", 3);
  EXPECT_EQ(module_.FileLabel("/var/log"), 3U);
  EXPECT_EQ(module_.FileLabel("/var/log/x"), 1U);
  module_.SetFileLabel("/var/log", 2);
  EXPECT_EQ(module_.FileLabel("/var/log"), 2U);
}

TEST_F(ModuleTest, AFileTakesOnlyLabelsThatExist) {
  module_.AddLabels({"logs"}, kObject);
  module_.RemoveLabels({"logs"}, kObject);
  for (const LabelId label : {0U, 3U, 4U}) {
    EXPECT_EQ(RefusalOf([&] { module_.SetFileLabel("/a", label); }),
              "EINVAL: no object label has the id " + std::to_string(label));
  }
  EXPECT_EQ(module_.FileLabel("/a"), 1U);
}

TEST_F(ModuleTest, AFileKeepsALabelThatIsRemovedLater) {
  module_.AddLabels({"logs"}, kObject);
  module_.SetFileLabel("/a", 3);
  module_.RemoveLabels({"logs"}, kObject);
  EXPECT_EQ(module_.FileLabel("/a"), 3U);
}

// ---- Tardisks ----

TEST_F(ModuleTest, TardiskWordsAreThoseOfTheDescription) {
  EXPECT_EQ(module_.Tardisk(TardiskWord::kLaunchDomain), "rootDom");
  EXPECT_EQ(module_.Tardisk(TardiskWord::kExecEvent), "exec");
  EXPECT_EQ(module_.Tardisk(TardiskWord::kDefaultLabel), "tardisk");
  EXPECT_EQ(module_.Tardisk(TardiskWord::kDefaultDomain), "appDom");
  EXPECT_EQ(RefusalOf([&] { module_.Tardisk(static_cast<TardiskWord>(4)); }),
            "EINVAL: no word about tardisks has the number 4");
}

}  // namespace
}  // namespace StandIn
