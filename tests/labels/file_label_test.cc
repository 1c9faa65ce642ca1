// The label of a single file, written and read.
#include <sys/xattr.h>

#include "tests/labels/labels_fixture.h"
#include "tests/support/scripted_kernel.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class FileLabelTest : public LabelsTest {
 protected:
  FileLabelTest() {
    Tardisk("base")
        .File("opt/file", "x")
        .Directory("opt/dir")
        .Symlink("opt/link", "file")
        .File("opt/other", "y");
    Define({"web", "mail"});
  }

  Outcome Set(const std::string& path, const std::string& label) {
    return RunWithInterface(
        [&](auto& iface) { return std::to_string(SecPolicy::SetFileLabel(path, label, iface)); });
  }
  Outcome Get(const std::string& path) {
    return RunWithInterface([&](auto& iface) { return SecPolicy::GetFileLabel(path, iface); });
  }
};

TEST_F(FileLabelTest, SettingLooksTheLabelUpAndWritesItsId) {
  const Outcome outcome = Set("/opt/file", "mail");
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.value, "0");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: lookup-label object mail",
                                          "kernel: set-file-label /opt/file mail"));
}

TEST_F(FileLabelTest, ReadingAsksForTheIdsName) {
  Set("/opt/dir", "mail");
  const Outcome outcome = Get("/opt/dir");
  EXPECT_EQ(outcome.value, "mail");
  EXPECT_THAT(outcome.events,
              ElementsAre("kernel: get-file-label /opt/dir", "kernel: label-name object 4"));
}

TEST_F(FileLabelTest, AttributeHoldsTheIdInFourNativeBytes) {
  Set("/opt/file", "mail");
  const Outcome outcome = Run([] {
    std::uint32_t id = 0;
    const ssize_t size = getxattr("/opt/file", "olvane.security", &id, sizeof id);
    return std::to_string(size) + " bytes: " + std::to_string(id);
  });
  EXPECT_EQ(outcome.value, "4 bytes: 4");
}

TEST_F(FileLabelTest, LabelsOfOtherFilesStay) {
  Set("/opt/file", "web");
  EXPECT_EQ(LabelOf("/opt/file"), "web");
  EXPECT_EQ(LabelOf("/opt/other"), "default");
  EXPECT_EQ(LabelOf("/opt"), "default");
}

TEST_F(FileLabelTest, LinkStandsForTheFileThatItNames) {
  EXPECT_THAT(Set("/opt/link", "web").Operations({"set-file-label"}),
              ElementsAre("set-file-label /opt/file web"));
  EXPECT_EQ(LabelOf("/opt/link"), "web");
}

TEST_F(FileLabelTest, FileWithoutTheAttributeCannotGainIt) {
  Assemble();
  StandIn::WriteBytes(InRoot("/opt/added"), "by hand");
  const Outcome outcome = Set("/opt/added", "web");
  EXPECT_EQ(outcome.error, "Unable to set file label (web) for file /opt/added: No data available");
  EXPECT_THAT(outcome.Operations(), ElementsAre("lookup-label object web"));
  EXPECT_EQ(Get("/opt/added").error,
            "Unable to get file label for file /opt/added:No data available");
}

TEST_F(FileLabelTest, FailuresNameLabelFileAndReason) {
  struct Case {
    std::string path;
    std::string reason;
  };
  const Case cases[] = {
      {"/opt/missing", "No such file or directory"},
      {"", "No such file or directory"},
      {"/opt/file/below", "Not a directory"},
      {"/" + std::string(300, 'n'), "File name too long"},
  };
  for (const Case& row : cases) {
    EXPECT_EQ(Set(row.path, "web").error,
              "Unable to set file label (web) for file " + row.path + ": " + row.reason);
    EXPECT_EQ(Get(row.path).error,
              "Unable to get file label for file " + row.path + ":" + row.reason);
  }
}

TEST_F(FileLabelTest, RefusalsOfTheKernelAreGivenAsTheSystemsReason) {
  struct Case {
    int number;
    std::string reason;
  };
  const Case cases[] = {{EACCES, "Permission denied"},
                        {EROFS, "Read-only file system"},
                        {ENOSPC, "No space left on device"}};
  for (const Case& row : cases) {
    FailNothing();
    Fail(Operation::kSetFileLabel, 1, row.number);
    Fail(Operation::kGetFileLabel, 1, row.number);
    EXPECT_EQ(Set("/opt/file", "web").error,
              "Unable to set file label (web) for file /opt/file: " + row.reason);
    EXPECT_EQ(Get("/opt/file").error, "Unable to get file label for file /opt/file:" + row.reason);
  }
  FailNothing();
  EXPECT_EQ(LabelOf("/opt/file"), "default");
}

TEST_F(FileLabelTest, UnknownLabelIsTheKernelsFailureAndNothingIsWritten) {
  const Outcome outcome = Set("/opt/file", "shelf");
  EXPECT_EQ(outcome.error, "no object label is named \"shelf\"");
  EXPECT_THAT(outcome.Operations(),
              ElementsAre("lookup-label object shelf ! no object label is named \"shelf\""));
  EXPECT_EQ(LabelOf("/opt/file"), "default");
}

TEST_F(FileLabelTest, LookUpComesBeforeTheFile) {
  EXPECT_EQ(Set("/opt/missing", "shelf").error, "no object label is named \"shelf\"");
}

TEST_F(FileLabelTest, DomainLabelsAreNoFileLabels) {
  Define({"guest"}, kDomainLabel);
  EXPECT_EQ(Set("/opt/file", "guest").error, "no object label is named \"guest\"");
}

TEST_F(FileLabelTest, IdThatNoLabelHasAnyMoreIsTheKernelsFailure) {
  Set("/opt/file", "mail");
  RunWithInterface([](auto& iface) { iface.RemoveLabels({"mail"}, kObjectLabel); });
  EXPECT_EQ(Get("/opt/file").error, "no object label has the id 4");
}

TEST_F(FileLabelTest, AttributeWithoutBytesIsTheIdZero) {
  const Outcome outcome = RunWithInterface([](auto& iface) {
    // An ordinary call leaves the second result register as it was.
    const ScriptedKernel kernel([](const SeenCall& call) {
      return KernelAnswer{0, static_cast<long>(call.arguments[2])};
    });
    return SecPolicy::GetFileLabel("/opt/file", iface);
  });
  EXPECT_EQ(outcome.error, "no object label has the id 0");
}

TEST_F(FileLabelTest, NothingIsLoggedHere) {
  for (const std::string path : {"/opt/file", "/opt/missing"}) {
    const Outcome outcome = Set(path, "web");
    EXPECT_THAT(outcome.Infos(), IsEmpty());
    EXPECT_EQ(outcome.err, "");
  }
}

TEST_F(FileLabelTest, OutOfMemoryInALookUpPassesThrough) {
  Fail(Fault{.operation = Operation::kLookupLabel, .kind = Fault::Kind::kOutOfMemory});
  Fail(Fault{.operation = Operation::kLabelName, .kind = Fault::Kind::kOutOfMemory});
  EXPECT_EQ(Set("/opt/file", "web").error, "other: std::bad_alloc");
  EXPECT_EQ(Get("/opt/file").error, "other: std::bad_alloc");
}

}  // namespace
}  // namespace SecPolicyTest
