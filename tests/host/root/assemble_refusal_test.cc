// Archives that are refused, and what is left as it was.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <ostream>
#include <random>

#include "host/state/state_file.h"
#include "tests/host/root/host_fixture.h"
#include "tests/support/counted_memory.h"

namespace StandIn {
namespace {

class RefusalFixture : public HostFixture {
 protected:
  // A machine in use, made of base.tar.
  RefusalFixture() {
    Tardisk("base.tar", Archive()
                            .Directory("dir")
                            .File("dir/file", "text")
                            .File("file", "text")
                            .Symlink("link", "/tmp")
                            .Symlink("inner", "dir"));
    Assembled();
    StateFile(Host()).Write("state");
    before_ = Snapshot();
  }

  // What an assembly in which memory ends may say.
  [[nodiscard]] std::string ErrorInShortage() const try {
    return AssembleError();
  } catch (const std::bad_alloc& shortage) {
    return shortage.what();
  }

  void ExpectNothingChanged() const { EXPECT_EQ(Snapshot(), before_); }

 private:
  std::set<std::string> before_;
};

struct Refusal {
  const char* name;
  std::string bytes;
  std::string message;  // behind "DIR/tardisks/new.tar: "
};

void PrintTo(const Refusal& refusal, std::ostream* stream) { *stream << refusal.message; }

RawArchive Raw(const RawHeader& header) { return RawArchive().Header(header); }

std::string Closed(RawArchive archive) { return archive.End().Text(); }

std::string Truncated(std::string bytes, std::size_t cut) {
  bytes.resize(bytes.size() - cut);
  return bytes;
}

std::string Damaged(std::string bytes, std::size_t offset) {
  bytes[offset] = static_cast<char>(~bytes[offset]);
  return bytes;
}

std::string PaxName(const std::string& name) {
  return Closed(RawArchive().Extended({{"path", name}}).Header({.name = "f"}));
}

std::string RepeatedName(const std::string& text, std::size_t times) {
  std::string result;
  for (std::size_t i = 0; i < times; ++i) {
    result += text;
  }
  return result;
}

// What no compression makes small.
std::string NoiseText() {
  std::mt19937 random(1);
  std::string noise;
  for (int i = 0; i < 200000; ++i) {
    noise += static_cast<char>(random());
  }
  return noise;
}

std::string GzipOfText() {
  return Archive(ARCHIVE_FORMAT_RAW, ARCHIVE_FILTER_GZIP).File("f", "only some text").Bytes();
}

std::vector<Refusal> Names() {
  return {
      {"EmptyName", Closed(Raw({.name = ""})), "entry \"\": the name is empty"},
      {"ParentAtTheStart", Closed(Raw({.name = "../evil"})),
       "entry \"../evil\": the name has a \"..\" component"},
      {"ParentInTheMiddle", Closed(Raw({.name = "dir/../../evil"})),
       "entry \"dir/../../evil\": the name has a \"..\" component"},
      {"ParentAtTheEnd", Closed(Raw({.name = "dir/..", .type = '5'})),
       "entry \"dir/..\": the name has a \"..\" component"},
      {"ParentBehindASlash", Closed(Raw({.name = "/../evil"})),
       "entry \"/../evil\": the name has a \"..\" component"},
      {"ParentInAnExtendedHeader", PaxName("../evil"),
       "entry \"../evil\": the name has a \"..\" component"},
      {"LongComponent", PaxName(std::string(256, 'n')),
       "entry \"" + std::string(255, 'n') + "...\": a component of the name is longer than 255 " +
           "bytes"},
      {"LongPath", PaxName(RepeatedName("abcd/", 819) + "e"),
       "entry \"" + RepeatedName("abcd/", 51) + "...\": the name is longer than 4095 bytes"},
      {"FileAsTheRoot", Closed(Raw({.name = "."})),
       "entry \".\": the root can only be a directory"},
      {"ControlCharacters", Closed(Raw({.name = "../\x1b[2J"})),
       "entry \"../\\x1b[2J\": the name has a \"..\" component"},
  };
}

std::vector<Refusal> Links() {
  return {
      {"ThroughALinkOfAnEarlierArchive", Archive().File("link/evil", "x").Bytes(),
       "entry \"link/evil\": passes through the symbolic link \"/link\" of \"base.tar\""},
      {"ThroughALinkThatStaysInside", Archive().File("inner/f", "x").Bytes(),
       "entry \"inner/f\": passes through the symbolic link \"/inner\" of \"base.tar\""},
      {"ThroughALinkOfTheSameArchive",
       Archive().Symlink("out", "../../..").File("out/evil", "x").Bytes(),
       "entry \"out/evil\": passes through the symbolic link \"/out\" of \"new.tar\""},
      {"ThroughAHardLinkToALink",
       Archive().Symlink("out", "/tmp").HardLink("again", "out").File("again/evil", "x").Bytes(),
       "entry \"again/evil\": passes through the symbolic link \"/again\" of \"new.tar\""},
      {"ThroughAFile", Archive().File("file/below", "x").Bytes(),
       "entry \"file/below\": passes through \"/file\", which is not a directory in \"base.tar\""},
      {"DirectoryOverALink", Archive().Directory("link").Bytes(),
       "entry \"link/\": a directory here, but something else in \"base.tar\""},
      {"HardLinkToAnAbsoluteTarget", Closed(Raw({.name = "h", .type = '1', .link = "/etc/passwd"})),
       "entry \"h\": hard link to \"/etc/passwd\": the target is absolute"},
      {"HardLinkToTheOutside", Closed(Raw({.name = "h", .type = '1', .link = "../../host.json"})),
       "entry \"h\": hard link to \"../../host.json\": the target has a \"..\" component"},
      {"HardLinkToNothing", Closed(Raw({.name = "h", .type = '1', .link = "none"})),
       "entry \"h\": hard link to \"none\": the archive has brought no such file before"},
      {"HardLinkToAnEarlierArchive", Closed(Raw({.name = "h", .type = '1', .link = "file"})),
       "entry \"h\": hard link to \"file\": the archive has brought no such file before"},
      {"HardLinkThroughALink", Closed(Raw({.name = "h", .type = '1', .link = "link/passwd"})),
       "entry \"h\": hard link to \"link/passwd\": the archive has brought no such file before"},
      {"HardLinkToADirectory", Archive().Directory("d").HardLink("h", "d").Bytes(),
       "entry \"h\": hard link to \"d\": the target is a directory"},
      {"HardLinkToItself", Archive().File("h", "x").HardLink("h", "h").Bytes(),
       "entry \"h\": hard link to \"h\": the target is the link itself"},
      {"HardLinkToAnotherTardisk",
       Closed(Raw({.name = "h", .type = '1', .link = "tardisks/base.tar"})),
       "entry \"h\": hard link to \"tardisks/base.tar\": the archive has brought no such file "
       "before"},
      {"HardLinkWithoutATarget", Closed(Raw({.name = "h", .type = '1', .link = ""})),
       "entry \"h\": entries of this type are not allowed in a tardisk"},
      {"LinkWithoutATarget", Closed(Raw({.name = "l", .type = '2', .link = ""})),
       "entry \"l\": a symbolic link without a target"},
      {"LinkWithALongTarget",
       Closed(RawArchive()
                  .Extended({{"linkpath", std::string(4096, 't')}})
                  .Header({.name = "l", .type = '2', .link = "x"})),
       "entry \"l\": a symbolic link with a target of more than 4095 bytes"},
  };
}

std::vector<Refusal> Kinds() {
  return {
      {"CharacterDevice", Closed(Raw({.name = "dev/null", .type = '3'})),
       "entry \"dev/null\": device nodes are not allowed in a tardisk"},
      {"BlockDevice", Closed(Raw({.name = "sda", .type = '4'})),
       "entry \"sda\": device nodes are not allowed in a tardisk"},
      {"Socket", Closed(Raw({.name = "s", .mode = "0140644"}).Header({.name = "dir"})),
       "entry \"dir\": a directory in \"base.tar\", but something else here"},
      {"DirectoryOverAFile", Archive().Directory("file").Bytes(),
       "entry \"file/\": a directory here, but something else in \"base.tar\""},
      {"LinkOverADirectory", Archive().Symlink("dir", "x").Bytes(),
       "entry \"dir\": a directory in \"base.tar\", but something else here"},
      {"FileOverItsOwnDirectory", Archive().File("a/b", "x").File("a", "x").Bytes(),
       "entry \"a\": a directory in \"new.tar\", but something else here"},
      {"FileAmongTheArchives", Archive().File("tardisks/base.tar", "x").Bytes(),
       "entry \"tardisks/base.tar\": nothing may be brought here: the directory holds the archives "
       "themselves"},
      {"DirectoryAmongTheArchives", Archive().Directory("./tardisks/sub").Bytes(),
       "entry \"./tardisks/sub/\": nothing may be brought here: the directory holds the archives "
       "themselves"},
      {"FileInPlaceOfTheArchives", Archive().File("tardisks", "x").Bytes(),
       "entry \"tardisks\": only a directory may have this name: it holds the archives themselves"},
      {"LinkInPlaceOfTheArchives", Archive().Symlink("/tardisks", "/tmp").Bytes(),
       "entry \"/tardisks\": only a directory may have this name: it holds the archives "
       "themselves"},
  };
}

std::vector<Refusal> Damage() {
  const std::string whole = Archive(ARCHIVE_FORMAT_TAR_USTAR).File("f", "text").Bytes();
  const std::string zipped =
      Archive(ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_GZIP).File("f", "text").Bytes();
  const std::string xz =
      Archive(ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_XZ).File("f", NoiseText()).Bytes();
  return {
      {"NoBytes", "", "at byte 0: Unrecognized archive format"},
      {"Text", "#!/bin/sh\necho this is no archive\n", "at byte 0: Unrecognized archive format"},
      {"LongText", std::string(5000, 'x'), "at byte 0: Unrecognized archive format"},
      {"AnotherFormat", Archive(ARCHIVE_FORMAT_ZIP).File("f", "text").Bytes(),
       "at byte 0: Unrecognized archive format"},
      {"CompressedText", GzipOfText(), "at byte 0: Unrecognized archive format"},
      {"HalfAHeader", whole.substr(0, 300), "at byte 0: Unrecognized archive format"},
      {"HeaderAlone", whole.substr(0, 512), "entry \"f\": Truncated tar archive"},
      {"CutInContent", whole.substr(0, 514), "entry \"f\": Truncated tar archive"},
      {"CutInPadding", whole.substr(0, 600),
       "entry \"f\": Truncated input file (needed 508 bytes, only 84 available)"},
      {"WithoutItsEnd", whole.substr(0, 1024),
       "at byte 1024: the mark of the archive's end is missing"},
      {"WithoutItsEndInASecondEntry",
       RawArchive().Header({.name = "a"}).Header({.name = "b", .type = '5'}).Text(),
       "at byte 1024: the mark of the archive's end is missing"},
      {"BadChecksum", Damaged(whole, 0), "at byte 0: Unrecognized archive format"},
      {"BadSecondHeader", whole.substr(0, 1024) + Damaged(whole, 3),
       "at byte 1024: Damaged tar archive"},
      {"SomethingBehindTheEnd", whole + "x", "at byte 2048: something follows the archive's end"},
      {"SomethingFarBehindTheEnd", whole + std::string(200000, '\0') + "x",
       "at byte 2048: something follows the archive's end"},
      {"AnotherArchiveBehindTheEnd", whole + whole,
       "at byte 2048: something follows the archive's end"},
      {"CompressionCut", Truncated(zipped, 10), "at byte 1536: truncated gzip input"},
      {"CompressionOfNothing",
       Archive(ARCHIVE_FORMAT_RAW, ARCHIVE_FILTER_GZIP).File("f", "").Bytes(),
       "at byte 0: Unrecognized archive format"},
      {"CompressionDamagedAtItsStart", zipped.substr(0, 10) + "\xff\xff\xff\xff",
       "at byte 0: damaged gzip data: invalid block type"},
      {"CompressionDamagedLater", Damaged(xz, xz.size() / 2),
       "entry \"f\": Lzma library error: Corrupted input data"},
      {"BadExtendedHeader",
       Closed(RawArchive()
                  .Header({.name = "x", .type = 'x', .size = OctalSize(12)})
                  .Content("99 path=evil")
                  .Header({.name = "f"})),
       "at byte 0: Ignoring malformed pax extended attribute"},
  };
}

std::vector<Refusal> Sizes() {
  return {
      {"MoreThanTheArchiveHolds",
       Closed(Raw({.name = "f", .size = OctalSize(1000000)}).Content("text")),
       "entry \"f\": Truncated tar archive"},
      {"MoreThanAnyDiskHolds", Closed(Raw({.name = "f", .size = "77777777777"}).Content("text")),
       "entry \"f\": Truncated tar archive"},
      {"ExtendedSize",
       Closed(RawArchive()
                  .Extended({{"size", "9223372036854775807"}})
                  .Header({.name = "f"})
                  .Content("text")),
       "at byte 0: Tar size attribute overflow"},
      {"NegativeSize", Closed(Raw({.name = "f", .size = std::string(12, '\xff')}).Content("text")),
       "at byte 0: Tar entry has negative size"},
      {"HoleBeyondTheLimit",
       Archive(ARCHIVE_FORMAT_TAR_PAX_RESTRICTED)
           .SparseFile("f", (std::int64_t{64} << 30) + 5000, 512, std::string(512, 'x'))
           .Bytes(),
       "entry \"f\": the tardisks unpack to more than 68719476736 bytes"},
      {"SparsePartsBeyondTheArchive",
       Closed(RawArchive()
                  .Extended({{"GNU.sparse.size", "100000"}, {"GNU.sparse.map", "0,512,50000,4096"}})
                  .Header({.name = "f", .size = OctalSize(512)})
                  .Content(std::string(512, 'x'))),
       "entry \"f\": the file is said to have 4608 bytes here, but the archive holds 512"},
      {"SparsePartsBeyondTheFile",
       Closed(RawArchive()
                  .Extended({{"GNU.sparse.size", "1000"}, {"GNU.sparse.map", "0,512,50000,512"}})
                  .Header({.name = "f", .size = OctalSize(1024)})
                  .Content(std::string(1024, 'x'))),
       "entry \"f\": the parts of the file lie outside of its 1000 bytes, or overlap"},
      {"SparsePartsBackwards",
       Closed(RawArchive()
                  .Extended({{"GNU.sparse.size", "100000"}, {"GNU.sparse.map", "50000,512,0,512"}})
                  .Header({.name = "f", .size = OctalSize(1024)})
                  .Content(std::string(1024, 'x'))),
       "entry \"f\": the parts of the file lie outside of its 100000 bytes, or overlap"},
  };
}

class RefusalTest : public RefusalFixture, public testing::WithParamInterface<Refusal> {};

TEST_P(RefusalTest, NamesWhatIsWrongAndChangesNothing) {
  Tardisk("new.tar", GetParam().bytes);
  EXPECT_EQ(AssembleError(), Path("tardisks/new.tar") + ": " + GetParam().message);
  ExpectNothingChanged();
}

std::string NameOf(const testing::TestParamInfo<Refusal>& tested) { return tested.param.name; }

INSTANTIATE_TEST_SUITE_P(Name, RefusalTest, testing::ValuesIn(Names()), NameOf);
INSTANTIATE_TEST_SUITE_P(Link, RefusalTest, testing::ValuesIn(Links()), NameOf);
INSTANTIATE_TEST_SUITE_P(Kind, RefusalTest, testing::ValuesIn(Kinds()), NameOf);
INSTANTIATE_TEST_SUITE_P(Damage, RefusalTest, testing::ValuesIn(Damage()), NameOf);
INSTANTIATE_TEST_SUITE_P(Size, RefusalTest, testing::ValuesIn(Sizes()), NameOf);

using AssembleRefusalTest = RefusalFixture;

TEST_F(AssembleRefusalTest, ArchivesAreRegularFiles) {
  std::filesystem::create_directory(Path("tardisks/sub"));
  std::filesystem::create_symlink("base.tar", Path("tardisks/link"));
  ASSERT_EQ(::mkfifo(Path("tardisks/fifo").c_str(), 0600), 0);
  EXPECT_EQ(AssembleError(),
            Path("tardisks") + ": not a regular file: \"fifo\", \"link\", \"sub\"");
  ExpectNothingChanged();
}

TEST_F(AssembleRefusalTest, AHostNeedsItsArchivesDirectory) {
  std::filesystem::rename(Path("tardisks"), Path("moved"));
  EXPECT_EQ(AssembleError(), Path("tardisks") + ": cannot be opened: No such file or directory");
  std::filesystem::rename(Path("moved"), Path("tardisks"));
  ExpectNothingChanged();
}

TEST_F(AssembleRefusalTest, TooManyEntriesAreRefused) {
  Tardisk("new.tar", Archive().File("a", "").File("b", ""));
  EXPECT_EQ(AssembleError({.entries = 6}),
            Path("tardisks/new.tar") +
                ": at byte 512: the tardisks hold more than 6 entries, with the directories that "
                "names imply");
  ExpectNothingChanged();
  EXPECT_EQ(AssembleError({.entries = 7}), "(nothing was thrown)");
}

TEST_F(AssembleRefusalTest, DirectoriesThatANameImpliesAreEntries) {
  Tardisk("new.tar", Archive().File("a/b/c/f", "").File("a/b/d/f", ""));
  EXPECT_EQ(AssembleError({.entries = 8}),
            Path("tardisks/new.tar") +
                ": entry \"a/b/c/f\": the tardisks hold more than 8 entries, with the directories "
                "that names imply");
  ExpectNothingChanged();
  EXPECT_EQ(AssembleError({.entries = 10}),
            Path("tardisks/new.tar") +
                ": entry \"a/b/d/f\": the tardisks hold more than 10 entries, with the directories "
                "that names imply");
  EXPECT_EQ(AssembleError({.entries = 11}), "(nothing was thrown)");
}

TEST_F(AssembleRefusalTest, DeepNamesAreRefused) {
  Tardisk("new.tar", PaxName(RepeatedName("d/", 256) + "f"));
  EXPECT_EQ(AssembleError(), Path("tardisks/new.tar") + ": entry \"" + RepeatedName("d/", 127) +
                                 "d...\": the name has more than 256 components");
  ExpectNothingChanged();
  EXPECT_EQ(AssembleError({.depth = 257}), "(nothing was thrown)");
}

TEST_F(AssembleRefusalTest, PathsAreLimitedTogether) {
  const std::string long1(200, 'n');
  const std::string long2(200, 'm');
  Tardisk("new.tar", Archive().File("1/" + long1, "").File("2/" + long2, ""));
  // 29 in base.tar, and here twice 2 for the directory and 203 for the file.
  EXPECT_EQ(AssembleError({.pathBytes = 438}),
            Path("tardisks/new.tar") + ": entry \"2/" + long2 +
                "\": the paths in the tardisks have more than 438 bytes together");
  ExpectNothingChanged();
  EXPECT_EQ(AssembleError({.pathBytes = 439}), "(nothing was thrown)");
}

// Nothing is made before the refusal, however many directories a short name implies.
TEST_F(AssembleRefusalTest, ManyImpliedDirectoriesAreRefusedEarly) {
  Archive archive;
  for (int i = 0; i < 2000; ++i) {
    archive.File(std::to_string(i) + "/" + RepeatedName("d/", 200) + "f", "");
  }
  Tardisk("new.tar", archive);
  EXPECT_EQ(AssembleError({.entries = 5 + 202 + 100}),
            Path("tardisks/new.tar") + ": entry \"1/" + RepeatedName("d/", 126) +
                "d...\": the tardisks hold more than 307 entries, with the directories that names "
                "imply");
  ExpectNothingChanged();
}

TEST_F(AssembleRefusalTest, WhereMemoryEndsTheArchiveIsNamed) {
  const std::string expected = Path("tardisks/new.tar") +
                               ": there is not enough memory to unpack it; the tardisks before it "
                               "hold 5 entries";
  Tardisk("new.tar", Archive().File("a/b/c/f", "text").File("a/b/d/f", ""));
  int named = 0;
  // Every third allocation fails, up to the first after the unpacking.
  for (unsigned int allocation = 0;; allocation += 3) {
    SecPolicyTest::FailAllocation(allocation);
    const std::string message = ErrorInShortage();
    const bool failed = SecPolicyTest::AllocationFailed();
    SecPolicyTest::FailNoAllocation();
    if (!failed || (named > 0 && message != expected)) break;
    EXPECT_THAT(message, testing::AnyOf(testing::HasSubstr("enough memory"), "std::bad_alloc"));
    named += message == expected ? 1 : 0;
    ExpectNothingChanged();
  }
  EXPECT_GT(named, 5);
}

TEST_F(AssembleRefusalTest, ADecompressionBombIsRefused) {
  Tardisk("new.tar", Archive(ARCHIVE_FORMAT_TAR_USTAR, ARCHIVE_FILTER_GZIP)
                         .File("bomb", std::string(10 << 20, '\0')));
  EXPECT_EQ(AssembleError({.bytes = 5 << 20}),
            Path("tardisks/new.tar") +
                ": entry \"bomb\": the tardisks unpack to more than 5242880 bytes");
  ExpectNothingChanged();
  EXPECT_EQ(AssembleError({.bytes = 11 << 20}), "(nothing was thrown)");
}

TEST_F(AssembleRefusalTest, ABombBehindTheEndIsRefused) {
  Tardisk("new.tar", Archive(ARCHIVE_FORMAT_RAW, ARCHIVE_FILTER_GZIP)
                         .File("f", Closed(Raw({.name = "f"})) + std::string(10 << 20, '\0')));
  EXPECT_EQ(
      AssembleError({.bytes = 5 << 20}),
      Path("tardisks/new.tar") + ": at byte 1536: the tardisks unpack to more than 5242880 bytes");
  ExpectNothingChanged();
}

TEST_F(AssembleRefusalTest, LimitsAreForAllArchivesTogether) {
  const std::string content(100000, 'x');
  Tardisk("c.tar", Archive().File("c", content));
  Tardisk("d.tar", Archive().File("d", content));
  EXPECT_EQ(AssembleError({.bytes = 150000}),
            Path("tardisks/d.tar") + ": at byte 0: the tardisks unpack to more than 150000 bytes");
  ExpectNothingChanged();
}

// Whatever is flipped, the archive is unpacked within root/ or refused with everything as it was.
TEST_F(AssembleRefusalTest, NoDamageReachesBeyondTheRoot) {
  const std::string whole = Archive(ARCHIVE_FORMAT_TAR_PAX_INTERCHANGE)
                                .File("d/f", "text")
                                .Symlink("d/l", "../../..")
                                .HardLink("d/h", "d/f")
                                .File(std::string(150, 'n'), "long")
                                .Bytes();
  std::mt19937 random(1);
  for (int round = 0; round < 200; ++round) {
    std::string bytes = whole;
    for (int flips = 0; flips < 3; ++flips) {
      bytes[random() % bytes.size()] = static_cast<char>(random());
    }
    Tardisk("new.tar", bytes);
    const std::string message = AssembleError();
    ASSERT_THAT(NamesIn(Path() + "/.."), testing::ElementsAre("host"));
    ASSERT_FALSE(Exists("root.new"));
    ASSERT_TRUE(Exists("image.json"));
    if (message != "(nothing was thrown)") {
      EXPECT_THAT(message, testing::StartsWith(Path("tardisks/new.tar") + ": "));
    }
  }
}

}  // namespace
}  // namespace StandIn
