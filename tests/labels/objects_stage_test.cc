// The objects stage of a load, and the objects' display.
#include <dirent.h>

#include "tests/labels/labels_fixture.h"
#include "tests/support/file_system_answers.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

class ObjectsStageTest : public LabelsTest {
 protected:
  Outcome LoadObjects() {
    return RunWithInterface(
        [&](auto& iface) { SecPolicy::LoadPolicyObjects(PolicyPath("objects"), iface); });
  }
};

TEST_F(ObjectsStageTest, DefinesTheObjectsOfAllFilesInTheOrderOfTheirPaths) {
  Policy("objects/b", "web\n");
  Policy("objects/a", "mail\nprint\n");
  const Outcome outcome = LoadObjects();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events,
              ElementsAre("info: Parsed all objects",                 //
                          "kernel: words object",                     //
                          "kernel: invalid-labels object",            //
                          "kernel: remove-labels object",             //
                          "kernel: add-labels object",                //
                          "kernel: predefined-label object default",  //
                          "kernel: predefined-label object tardisk",  //
                          "kernel: remove-labels object",             //
                          "kernel: add-labels object mail print web",
                          "info: Objects defined and obsolete objects removed"));
}

TEST_F(ObjectsStageTest, ObjectThatTheKernelHasIsAddedAgain) {
  Define({"web"});
  Policy("objects/a", "web\n");
  const Outcome outcome = LoadObjects();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(LastAdded(outcome), "add-labels object web");
  EXPECT_THAT(Objects(), ElementsAre(Pair("default", 1), Pair("tardisk", 2), Pair("web", 3)));
}

TEST_F(ObjectsStageTest, ObjectThatTwoFilesNameIsHandedOverTwice) {
  Policy("objects/a", "web\n");
  Policy("objects/b", "mail\nweb\n");
  const Outcome outcome = LoadObjects();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(LastAdded(outcome), "add-labels object web mail web");
}

TEST_F(ObjectsStageTest, ObjectsThatNoFileNamesAreRemovedAndListedButPredefinedOnesStay) {
  Define({"zeta", "alpha", "web"});
  Policy("objects/a", "web\n");
  EXPECT_THAT(LoadObjects().Infos(),
              ElementsAre("Parsed all objects", "The following objects have been removed:", "alpha",
                          "zeta", "Objects defined and obsolete objects removed"));
  EXPECT_THAT(Objects(), ElementsAre(Pair("default", 1), Pair("tardisk", 2), Pair("web", 5)));
}

TEST_F(ObjectsStageTest, EmptyDirectoryRemovesEverythingThatIsNotPredefined) {
  Define({"web"});
  const Outcome outcome = LoadObjects();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Infos(),
              ElementsAre("Parsed all objects", "The following objects have been removed:", "web",
                          "Objects defined and obsolete objects removed"));
  EXPECT_THAT(Objects(), ElementsAre(Pair("default", 1), Pair("tardisk", 2)));
}

TEST_F(ObjectsStageTest, BadLineIsLoggedAndTheRestIsAppliedBeforeTheStageFails) {
  Policy("objects/a", "web\nmail\ntwo names\nlost\n");
  Policy("objects/b", "print\n");
  const Outcome outcome = LoadObjects();
  EXPECT_EQ(outcome.error, "Failure in object policy");
  EXPECT_THAT(outcome.Errors(), ElementsAre(PolicyPath("objects/a") +
                                                ":3 : cannot define more than one object per line",
                                            "Error in parsing some object files"));
  EXPECT_THAT(outcome.Infos(), ElementsAre("Objects defined and obsolete objects removed"));
  EXPECT_EQ(LastAdded(outcome), "add-labels object web mail print");
}

TEST_F(ObjectsStageTest, EveryBadFileIsLogged) {
  Policy("objects/a", "one two\n");
  Policy("objects/b", "web\n");
  Policy("objects/c", "\none two three\n");
  const std::string failure = " : cannot define more than one object per line";
  EXPECT_THAT(LoadObjects().Errors(), ElementsAre(PolicyPath("objects/a") + ":1" + failure,
                                                  PolicyPath("objects/c") + ":2" + failure,
                                                  "Error in parsing some object files"));
}

TEST_F(ObjectsStageTest, UnopenableFileIsLoggedAndTheOthersAreApplied) {
  std::filesystem::create_symlink("nowhere", PolicyPath("objects/gone"));
  Policy("objects/z", "web\n");
  const Outcome outcome = RunWithInterface([&](auto& iface) {
    ReportType("gone", DT_REG);
    SecPolicy::LoadPolicyObjects(PolicyPath("objects"), iface);
  });
  EXPECT_EQ(outcome.error, "Failure in object policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Unable to open policy file " + PolicyPath("objects/gone"),
                          "Error in parsing some object files"));
  EXPECT_EQ(LastAdded(outcome), "add-labels object web");
}

TEST_F(ObjectsStageTest, KernelsReasonIsDroppedWhenItRefuses) {
  Policy("objects/a", "web\n");
  Fail(Operation::kAddLabels, 2);
  const Outcome outcome = LoadObjects();
  EXPECT_EQ(outcome.error, "Failure in object policy");
  EXPECT_EQ(outcome.err, "Error: Error in defining some objects\n");
  EXPECT_THAT(outcome.Infos(), ElementsAre("Parsed all objects"));
  EXPECT_THAT(outcome.Errors(), ElementsAre("Error in defining some objects"));
}

TEST_F(ObjectsStageTest, BadFileAndRefusalAreBothLoggedAndThrownOnce) {
  Policy("objects/a", "one two\n");
  Fail(Operation::kWords);
  const Outcome outcome = LoadObjects();
  EXPECT_EQ(outcome.error, "Failure in object policy");
  EXPECT_THAT(
      outcome.Errors(),
      ElementsAre(PolicyPath("objects/a") + ":1 : cannot define more than one object per line",
                  "Error in parsing some object files", "Error in defining some objects"));
}

TEST_F(ObjectsStageTest, WhatTheKernelDidBeforeItRefusedStays) {
  Define({"old"});
  Policy("objects/a", "web\n");
  Fail(Operation::kAddLabels, 2);
  LoadObjects();
  FailNothing();
  EXPECT_THAT(Objects(), ElementsAre(Pair("default", 1), Pair("tardisk", 2)));
}

TEST_F(ObjectsStageTest, UnlistableDirectoryPassesOutAndChangesNothing) {
  Define({"web"});
  std::filesystem::remove(PolicyPath("objects"));
  const Outcome outcome = LoadObjects();
  EXPECT_EQ(outcome.error, "Unable to open policy directory " + PolicyPath("objects"));
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(ObjectsStageTest, OutOfMemoryPassesThroughUnlogged) {
  Policy("objects/a", "web\n");
  Fail(Fault{.operation = Operation::kAddLabels, .call = 2, .kind = Fault::Kind::kOutOfMemory});
  const Outcome outcome = LoadObjects();
  EXPECT_EQ(outcome.error, "other: std::bad_alloc");
  EXPECT_THAT(outcome.Errors(), IsEmpty());
}

TEST_F(ObjectsStageTest, DisplayIsABannerAndALineAnObject) {
  Define({"web", "Mail"});
  const Outcome outcome =
      RunWithInterface([](auto& iface) { SecPolicy::DisplayPolicyObjects(iface); });
  const std::string dashes(33, '-');
  EXPECT_EQ(outcome.out, "\n\n" + dashes + "\nObjects Defined: Name (Kernel Id)\n\n" + dashes +
                             "\nMail (4)\ndefault (1)\ntardisk (2)\nweb (3)\n");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: words object"));
}

TEST_F(ObjectsStageTest, RefusedDisplayEndsBehindItsBanner) {
  Fail(Operation::kWords);
  const Outcome outcome =
      RunWithInterface([](auto& iface) { SecPolicy::DisplayPolicyObjects(iface); });
  EXPECT_EQ(outcome.error, "refused on request: words, call 1");
  EXPECT_TRUE(outcome.out.ends_with("--\n"));
}

}  // namespace
}  // namespace SecPolicyTest
