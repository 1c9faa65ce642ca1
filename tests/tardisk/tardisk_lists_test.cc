// Sorting the mounted tardisks into those with a policy of their own and those without.
#include <dirent.h>

#include "tests/support/file_system_answers.h"
#include "tests/tardisk/tardisk_lists_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST_F(TardiskListsTest, TardiskWithAPolicyFileIsInTheFirstListAlone) {
  PlainTardisks({"alpha", "beta", "gamma"});
  TardiskPolicyFile("vendor", "exception", "not read here");
  const Outcome outcome = Sort();
  EXPECT_EQ(outcome.value,
            "policy " + PolicyFilePath("exception") + "\n" + DefaultsBut({"vendor"}));
  EXPECT_THAT(outcome.events, ElementsAre("kernel: backing-tardisk vendor"));
}

TEST_F(TardiskListsTest, EmptyPolicyDirectoryGivesEveryTardiskInListingOrder) {
  PlainTardisks({"vendor", "network", "storage"});
  EmptyPolicyDirectory("base");
  const Outcome outcome = Sort();
  EXPECT_EQ(outcome.value, DefaultsBut({}));
  EXPECT_EQ(std::count(outcome.value.begin(), outcome.value.end(), '\n'), 4);
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(TardiskListsTest, OtherEntriesOfThePolicyDirectoryAreSkippedWithTheSameWord) {
  TardiskPolicyFile("vendor", "exception", "");
  Tardisk("vendor").Directory("etc/olvane/secpolicy/tardisks/sub");
  Tardisk("vendor").Symlink("etc/olvane/secpolicy/tardisks/link", "exception");
  const Outcome outcome = Sort();
  EXPECT_EQ(outcome.value, "policy " + PolicyFilePath("exception") + "\n");
  EXPECT_THAT(outcome.Errors(),
              testing::UnorderedElementsAre("Skipping directory sub", "Skipping directory link"));
}

TEST_F(TardiskListsTest, EntryOfUnreportedTypeIsSkipped) {
  TardiskPolicyFile("vendor", "exception", "");
  const Outcome outcome =
      Sort(kTardiskPolicyDir, [](Lists&) { ReportType("exception", DT_UNKNOWN); });
  EXPECT_EQ(outcome.value, "default /tardisks/vendor\n");
  EXPECT_THAT(outcome.events, ElementsAre("error: Error: Skipping directory exception"));
}

TEST_F(TardiskListsTest, HiddenPolicyFileCounts) {
  TardiskPolicyFile("vendor", ".exception", "");
  EXPECT_EQ(Sort().value, "policy " + PolicyFilePath(".exception") + "\n");
}

TEST_F(TardiskListsTest, PolicyFileOutsideEveryTardiskIsLoggedAndInNeitherList) {
  EmptyPolicyDirectory("base");
  Assemble();
  StandIn::WriteBytes(InRoot(PolicyFilePath("own")), "-E web appDom\n");
  const Outcome outcome = Sort();
  EXPECT_EQ(outcome.value, "default /tardisks/base\n");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: backing-tardisk",
                                          "error: Error: No backing tardisk for policy file " +
                                              PolicyFilePath("own")));
}

TEST_F(TardiskListsTest, FirstListedOfTwoPolicyFilesOfATardiskWins) {
  TardiskPolicyFile("vendor", "x", "");
  TardiskPolicyFile("vendor", "b", "");
  const std::vector<std::string> files = PolicyFiles();
  const Outcome outcome = Sort();
  EXPECT_EQ(outcome.value, "policy " + PolicyFilePath(files[0]) + "\n");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: backing-tardisk vendor", "kernel: backing-tardisk vendor",
                          "kernel: backing-tardisk vendor",
                          "error: Error: More than one exception specification for tardisk "
                          "/tardisks/vendor",
                          "error: Error: Ignoring " + PolicyFilePath(files[1])));
}

TEST_F(TardiskListsTest, EveryAcceptedPolicyIsAskedAfreshForEachNewOne) {
  TardiskPolicyFile("alpha", "one", "");
  TardiskPolicyFile("beta", "two", "");
  TardiskPolicyFile("gamma", "three", "");
  const std::vector<std::string> files = PolicyFiles();
  const auto question = [&](std::size_t i) { return "backing-tardisk " + TardiskOf(files[i]); };
  EXPECT_THAT(Sort().Operations(), ElementsAre(question(0),               //
                                               question(1), question(0),  //
                                               question(2), question(0), question(1)));
}

TEST_F(TardiskListsTest, QuestionsGoOnBehindAMatch) {
  TardiskPolicyFile("alpha", "one", "");
  TardiskPolicyFile("beta", "two", "");
  const std::vector<std::string> files = PolicyFiles();
  // Until the first tardisk has another file behind the second one's.
  for (int i = 0; i < 64 && TardisksByFile().size() < 3; ++i) {
    LinkPolicyFile(files[static_cast<std::size_t>(i % 2)], "again" + std::to_string(i));
  }
  ASSERT_GE(TardisksByFile().size(), 3u);
  const Outcome outcome = Sort();
  EXPECT_EQ(outcome.Operations(), Questions());
  EXPECT_EQ(outcome.Errors().size(), 2 * (PolicyFiles().size() - 2));
}

TEST_F(TardiskListsTest, TardiskThatIsNotMountedIsAcceptedAllTheSame) {
  TardiskPolicyFile("vendor", "exception", "");
  PlainTardisks({"base"});
  Assemble();
  std::filesystem::remove(InRoot("/tardisks/vendor"));
  EXPECT_EQ(Sort().value, "policy " + PolicyFilePath("exception") + "\ndefault /tardisks/base\n");
}

}  // namespace
}  // namespace SecPolicyTest
