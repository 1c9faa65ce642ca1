#include "host/root/assemble.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <locale.h>
#include <signal.h>
#include <sys/stat.h>

#include <chrono>
#include <thread>

#include "host/files/file_io.h"
#include "host/root/image_index.h"
#include "host/state/state_file.h"
#include "tests/host/root/host_fixture.h"
#include "tests/support/child_process.h"

namespace StandIn {
namespace {

using testing::UnorderedElementsAre;

class AssembleTest : public HostFixture {
 protected:
  // An ordinary user's, as far as a user of that kind can be played.
  void GiveHostAway() const {
    GiveToOrdinaryUser(std::filesystem::path(Path()).parent_path());
    GiveToOrdinaryUser(Path());
    for (const auto& entry : std::filesystem::recursive_directory_iterator(Path())) {
      GiveToOrdinaryUser(entry.path());
    }
  }

  [[nodiscard]] std::vector<std::string> PathsOf(const std::string& tardisk) const {
    const ImageIndex index = ParseImageIndex(ReadBytes(Path("image.json")), "image.json");
    for (const TardiskContent& content : index.tardisks) {
      if (content.name == tardisk) {
        return content.paths;
      }
    }
    return {"(no such archive)"};
  }

  [[nodiscard]] std::string LinkTarget(const std::string& pathInRoot) const {
    return std::filesystem::read_symlink(Path("root" + pathInRoot));
  }
};

TEST_F(AssembleTest, NoArchivesMakeAnEmptyRoot) {
  EXPECT_EQ(Assembled().entries, 0U);
  EXPECT_THAT(NamesIn(Path("root")), UnorderedElementsAre("tardisks"));
  EXPECT_TRUE(NamesIn(Path("root/tardisks")).empty());
  EXPECT_EQ(OwnerOf("/tardisks"), "");
  EXPECT_EQ(Mode(""), 0755U);
}

TEST_F(AssembleTest, EverythingThatAnArchiveHoldsIsMade) {
  Tardisk("base.tar", Archive()
                          .Directory("etc", 0711)
                          .File("etc/motd", "welcome", 0640)
                          .File("bin/run", std::string(200000, 'x'), 0755)
                          .Symlink("lib", "usr/lib")
                          .Fifo("run/pipe", 0622)
                          .HardLink("bin/again", "bin/run"));
  const AssembleReport report = Assembled();
  EXPECT_EQ(report.entries, 6U);
  EXPECT_EQ(Content("/etc/motd"), "welcome");
  EXPECT_EQ(Content("/bin/run"), std::string(200000, 'x'));
  EXPECT_EQ(LinkTarget("/lib"), "usr/lib");
  EXPECT_TRUE(S_ISFIFO(Status("/run/pipe").st_mode));
  EXPECT_EQ(Status("/bin/again").st_ino, Status("/bin/run").st_ino);
  EXPECT_EQ(Mode("/etc"), 0711U);
  EXPECT_EQ(Mode("/etc/motd"), 0640U);
  EXPECT_EQ(Mode("/bin/run"), 0755U);
  EXPECT_EQ(Mode("/run/pipe"), 0622U);
  EXPECT_EQ(Mode("/bin"), 0755U);
  EXPECT_THAT(PathsOf("base.tar"), testing::ElementsAre("/bin", "/bin/again", "/bin/run", "/etc",
                                                        "/etc/motd", "/lib", "/run", "/run/pipe"));
}

TEST_F(AssembleTest, TheProcessesMaskDoesntMatter) {
  Tardisk("base.tar", Archive().Directory("d", 0777).File("d/f", "", 0666).Fifo("p", 0666));
  const mode_t previous = ::umask(077);
  Assembled();
  ::umask(previous);
  EXPECT_EQ(Mode(""), 0755U);
  EXPECT_EQ(Mode("/tardisks"), 0755U);
  EXPECT_EQ(Mode("/d"), 0777U);
  EXPECT_EQ(Mode("/d/f"), 0666U);
  EXPECT_EQ(Mode("/p"), 0666U);
  EXPECT_EQ(Mode("/../image.json"), 0644U);
}

TEST_F(AssembleTest, SetIdBitsAreDroppedAndDirectoriesStayOpenToTheirOwner) {
  Tardisk("base.tar",
          Archive().Directory("d", 07000).File("d/f", "", 06755).File("d/none", "x", 0));
  Assembled();
  EXPECT_EQ(Mode("/d"), 0700U);
  EXPECT_EQ(Mode("/d/f"), 0755U);
  EXPECT_EQ(Mode("/d/none"), 0U);
}

TEST_F(AssembleTest, AnOrdinaryUserCanDoIt) {
  Tardisk("base.tar", Archive().Directory("d", 0).File("d/f", "text", 0400).File("d/g", "", 0));
  GiveHostAway();
  EXPECT_TRUE(PassesAsOrdinaryUser([&] {
    Assemble(Host());
    EXPECT_EQ(Content("/d/f"), "text");
    Assemble(Host());
    EXPECT_FALSE(Exists("root.new"));
  }));
}

TEST_F(AssembleTest, NamesLoseLeadingSlashesAndDots) {
  Tardisk("base.tar", Archive()
                          .Directory("./")
                          .File("./etc/motd", "a")
                          .File("/abs", "b")
                          .HardLink("./link", "./etc/motd"));
  Assembled();
  EXPECT_THAT(PathsOf("base.tar"), testing::ElementsAre("/abs", "/etc", "/etc/motd", "/link"));
}

TEST_F(AssembleTest, ArchivesComeInByteOrderOfTheirNames) {
  for (const char* name : {"b.tar", "a.tar", "B.tar", "\xff.tar"}) {
    Tardisk(name, Archive().File("motd", name));
  }
  const AssembleReport report = Assembled();
  std::vector<std::string> names;
  for (const AssembleReport::Tardisk& tardisk : report.tardisks) {
    names.push_back(tardisk.name);
    EXPECT_EQ(tardisk.entries, 1U);
  }
  EXPECT_THAT(names, testing::ElementsAre("B.tar", "a.tar", "b.tar", "\xff.tar"));
  EXPECT_EQ(report.entries, 4U);
  EXPECT_EQ(Content("/motd"), "\xff.tar");
  EXPECT_EQ(OwnerOf("/motd"), "\xff.tar");
}

TEST_F(AssembleTest, LaterFilesReplaceEarlierOnesOfAnyKind) {
  Tardisk("1.tar", Archive()
                       .File("file", "old", 0600)
                       .Symlink("link", "file")
                       .Fifo("fifo")
                       .HardLink("also", "file"));
  Tardisk("2.tar", Archive().Symlink("file", "/nowhere").File("link", "new").File("fifo", "new"));
  Assembled();
  EXPECT_EQ(LinkTarget("/file"), "/nowhere");
  EXPECT_EQ(Content("/link"), "new");
  EXPECT_EQ(Content("/fifo"), "new");
  EXPECT_EQ(Content("/also"), "old");
  EXPECT_THAT(PathsOf("1.tar"), testing::ElementsAre("/also"));
  EXPECT_THAT(PathsOf("2.tar"), testing::ElementsAre("/fifo", "/file", "/link"));
}

TEST_F(AssembleTest, WithinAnArchiveTheLastOneCounts) {
  Tardisk("1.tar",
          Archive().File("etc/motd", "first").Directory("etc", 0750).File("etc/motd", "second"));
  Assembled();
  EXPECT_EQ(Content("/etc/motd"), "second");
  EXPECT_EQ(Mode("/etc"), 0750U);
}

TEST_F(AssembleTest, DirectoriesKeepTheFirstArchivesOwnershipAndMode) {
  Tardisk("1.tar", Archive().Directory("etc", 0711).File("opt/one", ""));
  Tardisk("2.tar", Archive().Directory("etc", 0777).Directory("opt", 0777).File("etc/two", ""));
  Assembled();
  EXPECT_EQ(Mode("/etc"), 0711U);
  EXPECT_EQ(Mode("/opt"), 0755U);
  EXPECT_THAT(PathsOf("1.tar"), testing::ElementsAre("/etc", "/opt", "/opt/one"));
  EXPECT_THAT(PathsOf("2.tar"), testing::ElementsAre("/etc/two"));
}

TEST_F(AssembleTest, LinksMayPointAnywhereAndAreNotFollowed) {
  Tardisk("1.tar", Archive().Symlink("out", "../../../etc").Symlink("abs", Path("host.json")));
  Tardisk("2.tar", Archive().File("abs", "replaced"));
  Assembled();
  EXPECT_EQ(LinkTarget("/out"), "../../../etc");
  EXPECT_EQ(Content("/abs"), "replaced");
  EXPECT_EQ(ReadBytes(Path("host.json")), "{}");
}

TEST_F(AssembleTest, ArchivesAppearInTheRoot) {
  const std::string bytes = Archive().Directory("tardisks").File("f", "x").Bytes();
  Tardisk("base.tar", bytes);
  Assembled();
  EXPECT_EQ(Content("/tardisks/base.tar"), bytes);
  struct stat original {};
  ASSERT_EQ(::stat(Path("tardisks/base.tar").c_str(), &original), 0);
  EXPECT_EQ(Status("/tardisks/base.tar").st_ino, original.st_ino);
  EXPECT_EQ(OwnerOf("/tardisks/base.tar"), "");
}

TEST_F(AssembleTest, ArchivesOfAnotherFileSystemAreCopied) {
  const std::string bytes = Archive().File("f", std::string(100000, 'x')).Bytes();
  const ChildResult result = RunOnSmallFileSystem(Path("tardisks"), 1 << 20, [&] {
    Tardisk("base.tar", bytes);
    Assemble(HostDirectory(Path()));
    EXPECT_EQ(Content("/tardisks/base.tar"), bytes);
    EXPECT_EQ(Mode("/tardisks/base.tar"), 0644U);
  });
  if (result == ChildResult::kNotPermitted) {
    GTEST_SKIP() << "this user may not mount another file system";
  }
  EXPECT_EQ(result, ChildResult::kPassed);
}

TEST_F(AssembleTest, AFullDiskChangesNothing) {
  const std::string base = Archive().File("f", "old").Bytes();
  const std::string large = Archive().File("large", std::string(300000, 'x')).Bytes();
  const ChildResult result = RunOnSmallFileSystem(Path(), 1 << 19, [&] {
    HostDirectory::Create(Path(), "{}");
    const HostDirectory host(Path());
    Tardisk("base.tar", base);
    Assemble(host);
    StateFile(host).Write("state");
    const auto before = Snapshot();
    Tardisk("large.tar", large);
    EXPECT_EQ(MessageOf<HostError>([&] { Assemble(host); }),
              Path("root.new/large") + ": cannot be written: No space left on device");
    EXPECT_EQ(Snapshot(), before);
  });
  if (result == ChildResult::kNotPermitted) {
    GTEST_SKIP() << "this user may not mount a small file system";
  }
  EXPECT_EQ(result, ChildResult::kPassed);
}

TEST_F(AssembleTest, ANewImageIsANewStart) {
  Tardisk("base.tar", Archive().File("old", ""));
  Assembled();
  StateFile(Host()).Write("state");
  std::filesystem::remove(Path("tardisks/base.tar"));
  Tardisk("other.tar", Archive().File("new", ""));
  Assembled();
  EXPECT_THAT(NamesIn(Path("root")), UnorderedElementsAre("new", "tardisks"));
  EXPECT_THAT(NamesIn(Path()),
              UnorderedElementsAre("host.json", "tardisks", "root", "image.json", "kernel.lock"));
}

TEST_F(AssembleTest, LeftoversOfACrashAreRemoved) {
  std::filesystem::create_directories(Path("root.new/a/b"));
  WriteBytes(Path("root.new/a/b/f"), "x");
  std::filesystem::create_symlink(Path("tardisks"), Path("root.new/a/link"));
  std::filesystem::permissions(Path("root.new/a"), std::filesystem::perms::none);
  Tardisk("base.tar", Archive().File("f", ""));
  Assembled();
  EXPECT_THAT(NamesIn(Path("root")), UnorderedElementsAre("f", "tardisks"));
  EXPECT_FALSE(Exists("root.new"));
  EXPECT_TRUE(Exists("tardisks/base.tar"));
}

TEST_F(AssembleTest, ALinkInPlaceOfTheRootIsReplacedNotFollowed) {
  std::filesystem::create_directory(Path("elsewhere"));
  WriteBytes(Path("elsewhere/f"), "kept");
  std::filesystem::create_symlink("elsewhere", Path("root"));
  Assembled();
  EXPECT_TRUE(std::filesystem::is_directory(std::filesystem::symlink_status(Path("root"))));
  EXPECT_EQ(ReadBytes(Path("elsewhere/f")), "kept");
}

TEST_F(AssembleTest, WhateverMomentACrashComesTheIndexIsRightOrMissing) {
  Archive archive;
  for (int i = 0; i < 200; ++i) {
    archive.File("d" + std::to_string(i % 10) + "/f" + std::to_string(i), "content");
  }
  Tardisk("base.tar", archive);
  Assembled();
  for (int round = 0; round < 20; ++round) {
    StateFile(Host()).Write("state");
    const ino_t before = Status("").st_ino;
    const pid_t child = StartChild([&] { Assemble(Host()); });
    std::this_thread::sleep_for(std::chrono::milliseconds(2 * round));
    ::kill(child, SIGKILL);
    ChildPassed(child);
    if (Exists("image.json")) {
      const bool isNew = Status("").st_ino != before;
      EXPECT_EQ(Exists("kernel.json"), !isNew);
      for (const std::string& path : PathsOf("base.tar")) {
        EXPECT_TRUE(Exists("root" + path)) << path;
      }
    }
    Assembled();
  }
}

TEST_F(AssembleTest, WaitsForTheLock) {
  StateFile state(Host());
  std::optional<StateFile::Lock> lock(std::in_place, state);
  const pid_t child = StartChild([&] { Assemble(Host()); });
  std::this_thread::sleep_for(std::chrono::milliseconds(50));
  EXPECT_FALSE(Exists("root"));
  EXPECT_FALSE(Exists("root.new"));
  lock.reset();
  EXPECT_TRUE(ChildPassed(child));
  EXPECT_TRUE(Exists("root"));
}

TEST_F(AssembleTest, HolesOfSparseFilesStayHoles) {
  constexpr std::int64_t kSize = std::int64_t{1} << 30;
  Tardisk("base.tar", Archive(ARCHIVE_FORMAT_TAR_PAX_RESTRICTED)
                          .SparseFile("sparse", kSize, 1 << 20, std::string(4096, 'x'))
                          .File("after", "text"));
  Assembled();
  const struct stat status = Status("/sparse");
  EXPECT_EQ(status.st_size, kSize);
  EXPECT_LT(status.st_blocks * 512, 1 << 20);
  EXPECT_EQ(Content("/after"), "text");
}

TEST_F(AssembleTest, AnArchiveOfNothingButItsEndIsEmpty) {
  Tardisk("empty.tar", RawArchive().End().Text());
  EXPECT_EQ(Assembled().entries, 0U);
}

TEST_F(AssembleTest, PaddingMayFollowTheEnd) {
  Tardisk("padded.tar", RawArchive().Header({.name = "f"}).End().Text() + std::string(100000, 0));
  EXPECT_EQ(Assembled().entries, 1U);
}

TEST_F(AssembleTest, BytesOfNamesStayAsTheyAre) {
  // The same letter composed and decomposed, and bytes that are no characters at all.
  const std::string composed = "\xc3\xa4";
  const std::string decomposed = "a\xcc\x88";
  Tardisk("pax.tar", RawArchive()
                         .Extended({{"path", composed}})
                         .Header({.name = "f"})
                         .Extended({{"path", decomposed}})
                         .Header({.name = "f"})
                         .Extended({{"path", "l"}, {"linkpath", decomposed}})
                         .Header({.name = "f", .type = '2', .link = "x"})
                         .End()
                         .Text());
  Tardisk("plain.tar", RawArchive().Header({.name = "\xff\xfe"}).End().Text());
  for (const char* locale : {"C", "C.UTF-8"}) {
    const std::string previous = ::setlocale(LC_ALL, nullptr);
    ASSERT_NE(::setlocale(LC_ALL, locale), nullptr);
    Assembled();
    ::setlocale(LC_ALL, previous.c_str());
    EXPECT_THAT(NamesIn(Path("root")),
                UnorderedElementsAre("tardisks", composed, decomposed, "l", "\xff\xfe"));
    EXPECT_THAT(LinkTarget("/l"), decomposed);
    EXPECT_THAT(PathsOf("plain.tar"), testing::ElementsAre("/\xff\xfe"));
  }
}

TEST_F(AssembleTest, ANameEndsAtANul) {
  Tardisk("nul.tar", RawArchive()
                         .Extended({{"path", std::string("a\0/../../b", 10)}})
                         .Header({.name = "f"})
                         .End()
                         .Text());
  Assembled();
  EXPECT_THAT(NamesIn(Path("root")), UnorderedElementsAre("tardisks", "a"));
}

struct Packing {
  const char* name;
  int format;
  int filter;
};

class PackingTest : public HostFixture, public testing::WithParamInterface<Packing> {};

TEST_P(PackingTest, IsUnpacked) {
  std::string bytes;
  try {
    bytes = Archive(GetParam().format, GetParam().filter)
                .Directory("etc")
                .File("etc/motd", std::string(100000, 'x'))
                .Symlink("etc/link", "motd")
                .HardLink("etc/again", "etc/motd")
                .Bytes();
  } catch (const std::runtime_error& error) {
    GTEST_SKIP() << "this archive library cannot write it: " << error.what();
  }
  Tardisk("base.tar", bytes);
  EXPECT_EQ(Assembled().entries, 4U);
  EXPECT_EQ(Content("/etc/again"), std::string(100000, 'x'));
}

INSTANTIATE_TEST_SUITE_P(
    , PackingTest,
    testing::Values(Packing{"V7", ARCHIVE_FORMAT_TAR, ARCHIVE_FILTER_NONE},
                    Packing{"Ustar", ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_NONE},
                    Packing{"Pax", ARCHIVE_FORMAT_TAR_PAX_INTERCHANGE, ARCHIVE_FILTER_NONE},
                    Packing{"Gnu", ARCHIVE_FORMAT_TAR_GNUTAR, ARCHIVE_FILTER_NONE},
                    Packing{"Gzip", ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_GZIP},
                    Packing{"Bzip2", ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_BZIP2},
                    Packing{"Xz", ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_XZ},
                    Packing{"Lzip", ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_LZIP},
                    Packing{"Lz4", ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_LZ4},
                    Packing{"Zstd", ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_ZSTD}),
    [](const auto& tested) { return std::string(tested.param.name); });

}  // namespace
}  // namespace StandIn
