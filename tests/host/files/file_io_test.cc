#include "host/files/file_io.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <array>

#include "secpolicy/host/host_error.h"
#include "tests/support/child_process.h"
#include "tests/support/temporary_directory.h"

namespace StandIn {
namespace {

using testing::ElementsAre;

class FileIoTest : public testing::Test {
 protected:
  FileIoTest() { Open(); }

  void Open() { fd_ = UniqueFd(::open(Path().c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC)); }
  [[nodiscard]] std::string Path() const { return directory_.Path(); }
  [[nodiscard]] std::string Path(const std::string& name) const { return directory_ / name; }
  // Messages call the directory D.
  [[nodiscard]] DirectoryRef Ref() const { return {fd_.Get(), "D"}; }
  [[nodiscard]] std::string ReplaceError(const std::string& text) const {
    return MessageOf<HostError>([&] { ReplaceFile(Ref(), "f", text); });
  }

  TemporaryDirectory directory_;
  UniqueFd fd_;
};

TEST_F(FileIoTest, ReadsWholeFiles) {
  const std::string bytes = std::string(200000, 'x') + '\0' + "end";
  WriteBytes(Path("f"), bytes);
  EXPECT_EQ(ReadFile(Ref(), "f"), bytes);
  EXPECT_EQ(ReadFileIfThere(Ref(), "f"), bytes);
}

TEST_F(FileIoTest, AMissingFileIsNothingOrAnError) {
  EXPECT_EQ(ReadFileIfThere(Ref(), "f"), std::nullopt);
  EXPECT_EQ(MessageOf<HostError>([&] { ReadFile(Ref(), "f"); }),
            "D/f: cannot be opened: No such file or directory");
}

TEST_F(FileIoTest, OnlyRegularFilesAreRead) {
  ASSERT_EQ(::mkfifo(Path("fifo").c_str(), 0600), 0);
  EXPECT_EQ(MessageOf<HostError>([&] { ReadFile(Ref(), "fifo"); }), "D/fifo: not a regular file");
  ASSERT_EQ(::mkdir(Path("dir").c_str(), 0700), 0);
  EXPECT_EQ(MessageOf<HostError>([&] { ReadFile(Ref(), "dir"); }), "D/dir: not a regular file");
}

TEST_F(FileIoTest, AnUnreadableFileIsNamed) {
  WriteBytes(Path("f"), "secret");
  std::filesystem::permissions(Path("f"), std::filesystem::perms::none);
  GiveToOrdinaryUser(Path());
  GiveToOrdinaryUser(Path("f"));
  EXPECT_TRUE(PassesAsOrdinaryUser([&] {
    EXPECT_EQ(MessageOf<HostError>([&] { ReadFile(Ref(), "f"); }),
              "D/f: cannot be opened: Permission denied");
  }));
}

TEST_F(FileIoTest, ReplacingMakesAFileOrANewOne) {
  ReplaceFile(Ref(), "f", "one");
  EXPECT_EQ(ReadBytes(Path("f")), "one");
  struct stat first;
  ASSERT_EQ(::stat(Path("f").c_str(), &first), 0);
  const UniqueFd stillOpen(::open(Path("f").c_str(), O_RDONLY | O_CLOEXEC));

  ReplaceFile(Ref(), "f", std::string(300000, '2'));
  EXPECT_EQ(ReadBytes(Path("f")), std::string(300000, '2'));
  struct stat second;
  ASSERT_EQ(::stat(Path("f").c_str(), &second), 0);
  EXPECT_NE(first.st_ino, second.st_ino);
  EXPECT_THAT(NamesIn(Path()), ElementsAre("f"));
}

TEST_F(FileIoTest, WhatAKilledProcessLeftDoesntStandInTheWay) {
  WriteBytes(Path("elsewhere"), "untouched");
  ASSERT_EQ(::symlink("elsewhere", Path("f.new." + std::to_string(::getpid())).c_str()), 0);
  ReplaceFile(Ref(), "f", "text");
  EXPECT_EQ(ReadBytes(Path("f")), "text");
  EXPECT_EQ(ReadBytes(Path("elsewhere")), "untouched");
  EXPECT_THAT(NamesIn(Path()), testing::UnorderedElementsAre("f", "elsewhere"));
}

TEST_F(FileIoTest, OneWriterAtATimeRemovesWhatAKilledOneLeft) {
  EXPECT_FALSE(ChildPassed(StartChild([&] {
    const struct rlimit limit { 1000, 1000 };
    const struct rlimit noCore {};
    setrlimit(RLIMIT_CORE, &noCore);
    setrlimit(RLIMIT_FSIZE, &limit);
    ReplaceFile(Ref(), "f", std::string(2000, 'x'), Writers::kOne);  // is killed
  })));
  EXPECT_THAT(NamesIn(Path()), ElementsAre("f.new"));
  ReplaceFile(Ref(), "f", "text", Writers::kOne);
  EXPECT_EQ(ReadBytes(Path("f")), "text");
  EXPECT_THAT(NamesIn(Path()), ElementsAre("f"));
}

TEST_F(FileIoTest, AReadOnlyDirectoryKeepsTheOldFile) {
  WriteBytes(Path("f"), "old");
  std::filesystem::permissions(Path(), std::filesystem::perms(0555));
  GiveToOrdinaryUser(Path());
  GiveToOrdinaryUser(Path("f"));
  EXPECT_TRUE(PassesAsOrdinaryUser([&] {
    EXPECT_EQ(ReplaceError("new"), "D/f: cannot be written: Permission denied");
    EXPECT_EQ(ReadBytes(Path("f")), "old");
    EXPECT_THAT(NamesIn(Path()), ElementsAre("f"));
  }));
  std::filesystem::permissions(Path(), std::filesystem::perms(0755));
}

TEST_F(FileIoTest, AFullDiskKeepsTheOldFile) {
  const ChildResult result = RunOnSmallFileSystem(Path(), 65536, [&] {
    Open();
    ReplaceFile(Ref(), "f", "old");
    EXPECT_EQ(ReplaceError(std::string(200000, 'x')),
              "D/f: cannot be written: No space left on device");
    EXPECT_EQ(ReadBytes(Path("f")), "old");
    EXPECT_THAT(NamesIn(Path()), ElementsAre("f"));
    ReplaceFile(Ref(), "f", std::string(30000, 'y'));
    EXPECT_EQ(ReadBytes(Path("f")), std::string(30000, 'y'));
  });
  if (result == ChildResult::kNotPermitted) {
    GTEST_SKIP() << "this user may not mount a small file system";
  }
  EXPECT_EQ(result, ChildResult::kPassed);
}

TEST_F(FileIoTest, ATextMayComeInParts) {
  ReplaceFile(Ref(), "f", [](const TextSink& sink) {
    sink("one ");
    sink("");
    sink("two");
  });
  EXPECT_EQ(ReadBytes(Path("f")), "one two");
}

TEST_F(FileIoTest, ATextThatEndsHalfWayKeepsTheOldFile) {
  WriteBytes(Path("f"), "old");
  const TextWriter write = [](const TextSink& sink) {
    sink("half of the new");
    throw HostError("no more");
  };
  EXPECT_EQ(MessageOf<HostError>([&] { ReplaceFile(Ref(), "f", write); }), "no more");
  EXPECT_EQ(ReadBytes(Path("f")), "old");
  EXPECT_THAT(NamesIn(Path()), ElementsAre("f"));
}

TEST_F(FileIoTest, AFileIsReadFromAnyOffset) {
  WriteBytes(Path("f"), "0123456789");
  const UniqueFd fd = OpenFileIfThere(Ref(), "f");
  const TextReader reader = ReaderOf(fd.Get(), "D/f");
  std::array<char, 4> block{};
  EXPECT_EQ(reader(3, block), 4U);
  EXPECT_EQ(std::string_view(block.data(), 4), "3456");
  EXPECT_EQ(reader(8, block), 2U);
  EXPECT_EQ(reader(10, block), 0U);
  EXPECT_EQ(WholeText(reader), "0123456789");
}

TEST_F(FileIoTest, AFileThatCannotBeReadIsNamed) {
  const UniqueFd directory(::open(Path().c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  const TextReader reader = ReaderOf(directory.Get(), "D/f");
  EXPECT_EQ(MessageOf<HostError>([&] { WholeText(reader); }),
            "D/f: cannot be read: Is a directory");
}

TEST_F(FileIoTest, AVanishedDirectoryIsNamed) {
  std::filesystem::remove_all(Path());
  EXPECT_EQ(ReplaceError("new"), "D/f: cannot be written: No such file or directory");
}

TEST_F(FileIoTest, ADirectoryIsntReplaced) {
  ASSERT_EQ(::mkdir(Path("f").c_str(), 0700), 0);
  EXPECT_EQ(ReplaceError("new"), "D/f: cannot be written: Is a directory");
  EXPECT_THAT(NamesIn(Path()), ElementsAre("f"));
}

TEST(UniqueFdTest, ClosesWhatItOwnsOnce) {
  UniqueFd first(::open("/dev/null", O_RDONLY | O_CLOEXEC));
  const int number = first.Get();
  ASSERT_TRUE(first.IsOpen());
  UniqueFd second(std::move(first));
  EXPECT_FALSE(first.IsOpen());  // NOLINT: what a move leaves is part of the contract
  EXPECT_EQ(second.Get(), number);
  EXPECT_EQ(::fcntl(number, F_GETFD), FD_CLOEXEC);
  second = UniqueFd();
  EXPECT_EQ(::fcntl(number, F_GETFD), -1);
}

TEST(UniqueFdTest, GivesItsDescriptorAway) {
  int number = -1;
  {
    UniqueFd owner(::open("/dev/null", O_RDONLY | O_CLOEXEC));
    number = owner.Release();
  }
  EXPECT_EQ(::fcntl(number, F_GETFD), FD_CLOEXEC);
  const UniqueFd closer(number);
}

TEST_F(FileIoTest, AFileThatIsMissingIsMadeAndOneThatIsThereStays) {
  EXPECT_TRUE(MakeFileIfMissing(Ref(), "f", "one"));
  EXPECT_FALSE(MakeFileIfMissing(Ref(), "f", "two"));
  EXPECT_EQ(ReadFile(Ref(), "f"), "one");
  ASSERT_EQ(::symlink("nowhere", Path("link").c_str()), 0);
  EXPECT_FALSE(MakeFileIfMissing(Ref(), "link", "two"));
  EXPECT_THAT(NamesIn(Path("")), testing::UnorderedElementsAre("f", "link"));
}

}  // namespace
}  // namespace StandIn
