// The file-labels stage of a load.
#include "tests/labels/labels_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class FileLabelsStageTest : public LabelsTest {
 protected:
  FileLabelsStageTest() {
    Tardisk("base").File("opt/x", "").File("opt/y", "");
    Define({"web", "mail"});
  }

  Outcome LoadFileLabels() {
    return RunWithInterface(
        [&](auto& iface) { SecPolicy::LoadPolicyFileLabels(PolicyPath("fileLabels"), iface); });
  }
};

TEST_F(FileLabelsStageTest, ParsesEveryFileInPathOrderBeforeItSetsAnyLabel) {
  Policy("fileLabels/b", "/opt/y mail\n");
  Policy("fileLabels/a", "/opt/x web\n");
  const Outcome outcome = LoadFileLabels();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: validate-word object web",   //
                          "kernel: validate-word object mail",  //
                          "info: Parsed all file label mappings",
                          "kernel: lookup-label object web",     //
                          "kernel: set-file-label /opt/x web",   //
                          "kernel: lookup-label object mail",    //
                          "kernel: set-file-label /opt/y mail",  //
                          "info: Set all file labels"));
}

TEST_F(FileLabelsStageTest, EmptyDirectorySucceeds) {
  const Outcome outcome = LoadFileLabels();
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.events,
              ElementsAre("info: Parsed all file label mappings", "info: Set all file labels"));
}

TEST_F(FileLabelsStageTest, BadLineIsLoggedAndWhatParsedIsApplied) {
  Policy("fileLabels/a", "/opt/x web\n/opt/x web more\n/opt/x mail\n");
  Policy("fileLabels/b", "/opt/y mail\n");
  const Outcome outcome = LoadFileLabels();
  EXPECT_EQ(outcome.error, "Failure in file labels policy");
  EXPECT_THAT(outcome.Errors(),
              ElementsAre("Error parsing file " + PolicyPath("fileLabels/a"),
                          PolicyPath("fileLabels/a") + ":2 : incorrect no of parameters",
                          "Error in parsing some file label mappings."));
  EXPECT_THAT(outcome.Infos(), ElementsAre("Set all file labels"));
  EXPECT_THAT(outcome.Operations({"set-file-label"}),
              ElementsAre("set-file-label /opt/x web", "set-file-label /opt/y mail"));
}

TEST_F(FileLabelsStageTest, UnknownLabelSkipsTheRestOfItsFile) {
  Policy("fileLabels/a", "/opt/x shelf\n/opt/y web\n");
  const Outcome outcome = LoadFileLabels();
  EXPECT_EQ(outcome.error, "Failure in file labels policy");
  ASSERT_EQ(outcome.Errors().size(), 3u);
  EXPECT_EQ(outcome.Errors()[0], "Error parsing file " + PolicyPath("fileLabels/a"));
  EXPECT_THAT(outcome.Errors()[1], testing::HasSubstr("\"shelf\""));
  EXPECT_THAT(outcome.Operations({"set-file-label"}), IsEmpty());
}

TEST_F(FileLabelsStageTest, FailedMappingIsLoggedThreeTimesOver) {
  Policy("fileLabels/a", "/opt/none web\n/opt/y mail\n");
  const Outcome outcome = LoadFileLabels();
  EXPECT_EQ(outcome.error, "Failure in file labels policy");
  const std::string mapping = PolicyPath("fileLabels/a") +
                              ":1 : Unable to set file label (web) for file /opt/none: No such "
                              "file or directory";
  EXPECT_THAT(outcome.Errors(), ElementsAre(mapping, "There was a failure in setting file labels",
                                            "Error in setting some file labels."));
  EXPECT_EQ(outcome.err, "Error: " + mapping +
                             "\nError: There was a failure in setting file labels\n"
                             "Error: Error in setting some file labels.\n");
  EXPECT_THAT(outcome.Infos(), ElementsAre("Parsed all file label mappings"));
  EXPECT_EQ(LabelOf("/opt/y"), "mail");
}

TEST_F(FileLabelsStageTest, FailuresOfBothKindsAreThrownOnce) {
  Policy("fileLabels/a", "alone\n");
  Policy("fileLabels/b", "/opt/none web\n");
  const Outcome outcome = LoadFileLabels();
  EXPECT_EQ(outcome.error, "Failure in file labels policy");
  EXPECT_EQ(outcome.Errors().size(), 6u);
  EXPECT_THAT(outcome.Infos(), IsEmpty());
}

TEST_F(FileLabelsStageTest, UnlistableDirectoryPassesOut) {
  std::filesystem::remove(PolicyPath("fileLabels"));
  const Outcome outcome = LoadFileLabels();
  EXPECT_EQ(outcome.error, "Unable to open policy directory " + PolicyPath("fileLabels"));
  EXPECT_THAT(outcome.events, IsEmpty());
}

TEST_F(FileLabelsStageTest, OutOfMemoryPassesThroughUnloggedAndEndsTheStage) {
  Policy("fileLabels/a", "/opt/x web\n/opt/y mail\n");
  for (const Operation operation : {Operation::kValidateWord, Operation::kLookupLabel}) {
    FailNothing();
    Fail(Fault{.operation = operation, .call = 2, .kind = Fault::Kind::kOutOfMemory});
    const Outcome outcome = LoadFileLabels();
    EXPECT_EQ(outcome.error, "other: std::bad_alloc");
    EXPECT_THAT(outcome.Errors(), IsEmpty());
  }
  EXPECT_EQ(LabelOf("/opt/x"), "web");
  EXPECT_EQ(LabelOf("/opt/y"), "default");
}

}  // namespace
}  // namespace SecPolicyTest
