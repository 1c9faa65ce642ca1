// Labelling a directory with everything below it.
#include <dirent.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <sys/un.h>
#include <unistd.h>

#include "host/files/unique_fd.h"
#include "tests/labels/labels_fixture.h"
#include "tests/support/file_system_answers.h"
#include "tests/support/open_descriptors.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAreArray;
using testing::IsEmpty;

class DirectoryLabelTest : public LabelsTest {
 protected:
  // Labels the tree with "web". `prepare` runs inside, before that.
  Outcome Label(
      const std::string& dir, const std::function<void()>& prepare = [] {}) {
    if (!defined_) Define({"web"});
    defined_ = true;
    return RunWithInterface([&](auto& iface) {
      prepare();
      SecPolicy::SetDirLabelRecursive(dir, "web", iface);
    });
  }

  // The entries of a directory of the host as paths, in the order in which it lists them.
  std::vector<std::string> Entries(const std::string& dir) {
    std::vector<std::string> paths;
    for (const std::string& name : StandIn::NamesIn(InRoot(dir))) paths.push_back(dir + "/" + name);
    return paths;
  }

  // Puts something else in the place of a file of the host, which carries that file's label.
  template <typename Make>
  void Replace(const std::string& path, const Make& make) {
    Assemble();
    std::filesystem::remove(InRoot(path));
    make(InRoot(path));
  }

  // What labelling /opt does to the entry "node", whatever it is.
  void ExpectNodeIsLabelled(bool labelled) {
    const Outcome outcome = Label("/opt");
    EXPECT_EQ(outcome.error, "");
    EXPECT_THAT(outcome.Operations(),
                labelled ? ElementsAreArray(Labelling({"/opt", "/opt/node"}, "web"))
                         : ElementsAreArray(Labelling({"/opt"}, "web")));
    EXPECT_EQ(LabelOf("/opt/node"), labelled ? "web" : "default");
  }

 private:
  bool defined_ = false;
};

TEST_F(DirectoryLabelTest, DirectoryComesFirstThenItsEntriesInListingOrder) {
  Tardisk("base").File("opt/c", "").File("opt/a", "").File("opt/.b", "").File("etc/x", "");
  Assemble();
  std::vector<std::string> expected = Entries("/opt");
  expected.insert(expected.begin(), "/opt");
  const Outcome outcome = Label("/opt");
  EXPECT_EQ(outcome.error, "");
  EXPECT_THAT(outcome.Operations(), ElementsAreArray(Labelling(expected, "web")));
  EXPECT_EQ(LabelOf("/etc/x"), "default");
}

TEST_F(DirectoryLabelTest, SubdirectoryIsLabelledTwiceAndDescendedIntoAtOnce) {
  Tardisk("base")
      .File("opt/a", "")
      .File("opt/sub/deep/x", "")
      .File("opt/sub/y", "")
      .File("opt/z", "");
  Assemble();
  std::vector<std::string> expected;
  const std::function<void(const std::string&)> visit = [&](const std::string& dir) {
    expected.push_back(dir);
    for (const std::string& path : Entries(dir)) {
      expected.push_back(path);
      if (std::filesystem::is_directory(InRoot(path))) visit(path);
    }
  };
  visit("/opt");
  ASSERT_EQ(expected.size(), 9u);  // seven files, of which two directories once more
  EXPECT_THAT(Label("/opt").Operations(), ElementsAreArray(Labelling(expected, "web")));
  EXPECT_EQ(LabelOf("/opt/sub/deep"), "web");
  EXPECT_EQ(LabelOf("/opt/sub/deep/x"), "web");
}

TEST_F(DirectoryLabelTest, EmptyDirectoryIsLabelledItself) {
  Tardisk("base").Directory("opt");
  EXPECT_THAT(Label("/opt").Operations(), ElementsAreArray(Labelling({"/opt"}, "web")));
}

TEST_F(DirectoryLabelTest, TrailingSlashIsKeptInThePaths) {
  Tardisk("base").File("opt/a", "");
  Fail(Operation::kSetFileLabel, 2, EACCES);
  EXPECT_EQ(Label("/opt/").error,
            "Unable to set file label (web) for file /opt//a: Permission denied");
}

TEST_F(DirectoryLabelTest, RegularFileIsLabelled) {
  Tardisk("base").File("opt/node", "");
  ExpectNodeIsLabelled(true);
}

TEST_F(DirectoryLabelTest, NamedPipeIsLabelled) {
  Tardisk("base").Fifo("opt/node");
  ExpectNodeIsLabelled(true);
}

TEST_F(DirectoryLabelTest, SymbolicLinkIsNeitherLabelledNorFollowed) {
  Tardisk("base").Symlink("opt/node", "../etc").File("etc/x", "");
  ExpectNodeIsLabelled(false);
  EXPECT_EQ(LabelOf("/etc"), "default");
  EXPECT_EQ(LabelOf("/etc/x"), "default");
}

TEST_F(DirectoryLabelTest, SocketIsSkipped) {
  Tardisk("base").File("opt/node", "");
  Replace("/opt/node", [](const std::string& path) {
    const StandIn::UniqueFd fd(socket(AF_UNIX, SOCK_STREAM, 0));
    sockaddr_un address{.sun_family = AF_UNIX, .sun_path = {}};
    ASSERT_LT(path.copy(address.sun_path, sizeof address.sun_path), sizeof address.sun_path);
    ASSERT_EQ(bind(fd.Get(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
  });
  ExpectNodeIsLabelled(false);
}

class DeviceLabelTest : public DirectoryLabelTest, public testing::WithParamInterface<mode_t> {};

TEST_P(DeviceLabelTest, DeviceNodeIsLabelled) {
  Tardisk("base").File("opt/node", "");
  int failure = 0;
  Replace("/opt/node", [&](const std::string& path) {
    if (mknod(path.c_str(), GetParam() | 0600, makedev(1, 3)) != 0) failure = errno;
  });
  if (failure == EPERM) GTEST_SKIP() << "this user may not make device nodes";
  ASSERT_EQ(failure, 0);
  ExpectNodeIsLabelled(true);
}

INSTANTIATE_TEST_SUITE_P(CharacterAndBlock, DeviceLabelTest, testing::Values(S_IFCHR, S_IFBLK));

TEST_F(DirectoryLabelTest, TypeIsTakenFromTheListingAlone) {
  Tardisk("base").File("opt/node", "");
  const struct {
    unsigned char reported;
    std::vector<std::string> labelled;
  } cases[] = {
      {DT_UNKNOWN, {"/opt"}},
      {DT_LNK, {"/opt"}},
      {DT_SOCK, {"/opt"}},
      {DT_WHT, {"/opt"}},
      {DT_CHR, {"/opt", "/opt/node"}},
      {DT_BLK, {"/opt", "/opt/node"}},
      {DT_FIFO, {"/opt", "/opt/node"}},
  };
  for (const auto& row : cases) {
    const Outcome outcome = Label("/opt", [&] { ReportType("node", row.reported); });
    EXPECT_EQ(outcome.error, "");
    EXPECT_THAT(outcome.Operations(), ElementsAreArray(Labelling(row.labelled, "web")))
        << "reported as type " << int{row.reported};
  }
}

TEST_F(DirectoryLabelTest, UnlabelledDirectoryIsNotOpened) {
  Tardisk("base").Directory("opt");
  Fail(Operation::kSetFileLabel, 1, EACCES);
  EXPECT_EQ(Label("/opt").error, "Unable to set file label (web) for file /opt: Permission denied");
  FailNothing();
  EXPECT_EQ(Label("/none").error,
            "Unable to set file label (web) for file /none: No such file or directory");
}

TEST_F(DirectoryLabelTest, WhatCannotBeOpenedFailsAfterItWasLabelled) {
  Tardisk("base").File("opt/file", "");
  const Outcome outcome = Label("/opt/file");
  EXPECT_EQ(outcome.error, "Unable to open directory /opt/file");
  EXPECT_EQ(LabelOf("/opt/file"), "web");
}

TEST_F(DirectoryLabelTest, SubdirectoryThatCannotBeOpenedEndsTheTree) {
  Tardisk("base").File("opt/node", "");
  const Outcome outcome = Label("/opt", [] { ReportType("node", DT_DIR); });
  EXPECT_EQ(outcome.error, "Unable to open directory /opt/node");
  EXPECT_THAT(outcome.Operations(),
              ElementsAreArray(Labelling({"/opt", "/opt/node", "/opt/node"}, "web")));
}

TEST_F(DirectoryLabelTest, FirstFailureEndsTheTreeAndWhatWasLabelledStays) {
  Tardisk("base").File("opt/a", "").File("opt/b", "").File("opt/c", "");
  Assemble();
  const std::vector<std::string> entries = Entries("/opt");
  Fail(Operation::kSetFileLabel, 3, EPERM);
  const Outcome outcome = Label("/opt");
  EXPECT_EQ(outcome.error,
            "Unable to set file label (web) for file " + entries[1] + ": Operation not permitted");
  EXPECT_THAT(outcome.Operations({"set-file-label"}), testing::SizeIs(3));
  FailNothing();
  EXPECT_EQ(LabelOf("/opt"), "web");
  EXPECT_EQ(LabelOf(entries[0]), "web");
  EXPECT_EQ(LabelOf(entries[1]), "default");
  EXPECT_EQ(LabelOf(entries[2]), "default");
}

TEST_F(DirectoryLabelTest, FailureInASubdirectoryEndsTheWholeTree) {
  Tardisk("base").File("opt/sub/x", "").File("opt/sub/y", "");
  Fail(Operation::kSetFileLabel, 4, EPERM);  // /opt, sub, sub once more, its first entry
  const Outcome outcome = Label("/opt");
  Assemble();
  EXPECT_EQ(outcome.error, "Unable to set file label (web) for file " + Entries("/opt/sub")[0] +
                               ": Operation not permitted");
  EXPECT_THAT(outcome.Operations({"set-file-label"}), testing::SizeIs(4));
}

TEST_F(DirectoryLabelTest, FileWithoutTheAttributeEndsTheTree) {
  Tardisk("base").Directory("opt");
  Assemble();
  StandIn::WriteBytes(InRoot("/opt/added"), "by hand");
  EXPECT_EQ(Label("/opt").error,
            "Unable to set file label (web) for file /opt/added: No data available");
}

TEST_F(DirectoryLabelTest, UnknownLabelEndsTheTreeBeforeItBegins) {
  Tardisk("base").File("opt/a", "");
  const Outcome outcome = RunWithInterface(
      [](auto& iface) { SecPolicy::SetDirLabelRecursive("/opt", "shelf", iface); });
  EXPECT_EQ(outcome.error, "no object label is named \"shelf\"");
  EXPECT_THAT(outcome.Operations({"set-file-label"}), IsEmpty());
}

TEST_F(DirectoryLabelTest, DirectoriesAreClosedOnEveryWayOut) {
  Tardisk("base").File("opt/sub/deep/x", "");
  Define({"web"});
  for (const std::uint64_t failing : {0U, 1U, 2U, 3U, 4U, 5U, 6U}) {
    FailNothing();
    Fail(Operation::kSetFileLabel, failing);
    const Outcome outcome = RunWithInterface([](auto& iface) {
      const int before = OpenDescriptors();
      try {
        SecPolicy::SetDirLabelRecursive("/opt", "web", iface);
      } catch (const Tavon::Lib::TavonException&) {
      }
      return OpenDescriptors() - before;
    });
    EXPECT_EQ(outcome.value, "0") << "label " << failing << " refused";
  }
}

}  // namespace
}  // namespace SecPolicyTest
