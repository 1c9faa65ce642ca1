#include "host/root/image_layout.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "host/archives/entry_path.h"
#include "tests/support/temporary_directory.h"

namespace StandIn {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class ImageLayoutTest : public testing::Test {
 protected:
  ImageLayoutTest() { layout_.BeginTardisk("base.tar"); }

  void Directory(const std::string& path) { layout_.BringDirectory(path); }
  void File(const std::string& path, PathKind kind = PathKind::kOther) {
    layout_.BringFile(path, kind);
  }
  template <typename Call>
  std::string Refusal(const Call& call) {
    return MessageOf<BadEntry>(call);
  }

  ImageLayout layout_;
};

TEST_F(ImageLayoutTest, MissingParentsComeOutermostFirst) {
  EXPECT_THAT(layout_.BringParents("/a/b/c"), ElementsAre("/a", "/a/b"));
  EXPECT_THAT(layout_.BringParents("/a/b/d"), IsEmpty());
  EXPECT_THAT(layout_.BringParents("/a/x/d"), ElementsAre("/a/x"));
  EXPECT_THAT(layout_.BringParents("/"), IsEmpty());
}

TEST_F(ImageLayoutTest, DirectoriesBelongToTheFirstWhoBringsThem) {
  EXPECT_EQ(layout_.BringDirectory("/etc"), ImageLayout::DirectoryUse::kMake);
  EXPECT_EQ(layout_.BringDirectory("/etc"), ImageLayout::DirectoryUse::kSetMode);
  layout_.BeginTardisk("extra.tar");
  EXPECT_EQ(layout_.BringDirectory("/etc"), ImageLayout::DirectoryUse::kLeave);
  EXPECT_EQ(layout_.Index().tardisks,
            (std::vector<TardiskContent>{{"base.tar", {"/etc"}}, {"extra.tar", {}}}));
}

TEST_F(ImageLayoutTest, TheRootAndTheArchivesDirectoryBelongToNobody) {
  EXPECT_EQ(layout_.BringDirectory("/"), ImageLayout::DirectoryUse::kLeave);
  EXPECT_EQ(layout_.BringDirectory("/tardisks"), ImageLayout::DirectoryUse::kLeave);
  EXPECT_EQ(layout_.Index().tardisks, (std::vector<TardiskContent>{{"base.tar", {}}}));
}

TEST_F(ImageLayoutTest, LaterFilesTakeOver) {
  EXPECT_EQ(layout_.BringFile("/motd", PathKind::kOther), ImageLayout::FileUse::kMake);
  layout_.BeginTardisk("extra.tar");
  EXPECT_EQ(layout_.BringFile("/motd", PathKind::kSymlink), ImageLayout::FileUse::kReplace);
  EXPECT_EQ(layout_.Index().tardisks,
            (std::vector<TardiskContent>{{"base.tar", {}}, {"extra.tar", {"/motd"}}}));
}

TEST_F(ImageLayoutTest, DirectoryAndFileDontMix) {
  Directory("/dir");
  File("/file");
  layout_.BeginTardisk("extra.tar");
  EXPECT_EQ(Refusal([&] { File("/dir"); }), "a directory in \"base.tar\", but something else here");
  EXPECT_EQ(Refusal([&] { Directory("/file"); }),
            "a directory here, but something else in \"base.tar\"");
  EXPECT_EQ(Refusal([&] { File("/"); }), "the root can only be a directory");
}

TEST_F(ImageLayoutTest, NothingLiesBelowWhatIsNoDirectory) {
  File("/file");
  File("/link", PathKind::kSymlink);
  EXPECT_EQ(Refusal([&] { layout_.BringParents("/link/a/b"); }),
            "passes through the symbolic link \"/link\" of \"base.tar\"");
  EXPECT_EQ(Refusal([&] { layout_.BringParents("/file/a"); }),
            "passes through \"/file\", which is not a directory in \"base.tar\"");
  EXPECT_EQ(layout_.Index().tardisks,
            (std::vector<TardiskContent>{{"base.tar", {"/file", "/link"}}}));
}

TEST_F(ImageLayoutTest, HardLinksAreOfTheKindOfTheirTarget) {
  File("/file");
  File("/link", PathKind::kSymlink);
  EXPECT_EQ(layout_.KindOfHardLink("/new", "/file"), PathKind::kOther);
  EXPECT_EQ(layout_.KindOfHardLink("/new", "/link"), PathKind::kSymlink);
}

TEST_F(ImageLayoutTest, HardLinksNeedAFileOfTheirOwnArchive) {
  Directory("/dir");
  File("/old");
  layout_.BeginTardisk("extra.tar");
  const struct {
    std::string target;
    std::string message;
  } cases[] = {
      {"/none", "the archive has brought no such file before"},
      {"/old", "the archive has brought no such file before"},
      {"/dir", "the target is a directory"},
      {"/new", "the target is the link itself"},
  };
  for (const auto& [target, message] : cases) {
    EXPECT_EQ(Refusal([&, &t = target] { static_cast<void>(layout_.KindOfHardLink("/new", t)); }),
              message);
  }
}

}  // namespace
}  // namespace StandIn
