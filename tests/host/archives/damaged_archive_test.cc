// Archives of every format that is read, damaged in every place: what is wrong is found out, or the
// content is what it was.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>
#include <zlib.h>

#include <algorithm>
#include <cstdlib>
#include <iterator>
#include <random>

#include "host/archives/tar_reader.h"
#include "tests/host/root/host_fixture.h"
#include "tests/support/archives.h"

namespace StandIn {
namespace {

constexpr char kRefused[] = "refused: ";

UniqueFd FileOf(const std::string& bytes) {
  UniqueFd fd(::memfd_create("archive", MFD_CLOEXEC));
  EXPECT_EQ(::pwrite(fd.Get(), bytes.data(), bytes.size(), 0), static_cast<ssize_t>(bytes.size()));
  return fd;
}

// Everything that an archive brings, or kRefused and why it is refused.
std::string ContentOf(const std::string& bytes) try {
  const UniqueFd fd = FileOf(bytes);
  UnpackBudget budget({.bytes = 1 << 20, .entries = 100});
  TarReader reader(fd.Get(), "A", budget);
  std::string content;
  while (reader.Next()) {
    const TarEntry& entry = reader.Entry();
    content += entry.name + "|" + std::to_string(static_cast<int>(entry.kind)) + "|" +
               entry.target + "|" + std::to_string(entry.mode) + "|" + std::to_string(entry.size);
    std::string file(entry.size, '\0');
    reader.ReadContent([&](std::uint64_t offset, std::string_view part) {
      file.replace(offset, part.size(), part);
    });
    content += "|" + file;
    content += "\n";
  }
  return content;
} catch (const HostError& refusal) {
  return kRefused + std::string(refusal.what());
}

bool IsRefused(const std::string& content) { return content.starts_with(kRefused); }

std::string LittleEndian(std::uint64_t number, int bytes) {
  std::string text;
  for (int i = 0; i < bytes; ++i) text += static_cast<char>(number >> 8 * i);
  return text;
}

// A member of a gzip file that stores its bytes, with a name in its header.
std::string StoredGzip(const std::string& bytes) {
  using namespace std::string_literals;
  const auto size = static_cast<std::uint16_t>(bytes.size());
  const auto* data = reinterpret_cast<const Bytef*>(bytes.data());
  return "\x1f\x8b\x08\x08\0\0\0\0\0\x03"s + "policy.tar\0\x01"s + LittleEndian(size, 2) +
         LittleEndian(static_cast<std::uint16_t>(~size), 2) + bytes +
         LittleEndian(::crc32(0, data, size), 4) + LittleEndian(size, 4);
}

// What the zstd program makes of `bytes`: unlike the archive library, it writes a checksum.
std::string Zstd(const std::string& bytes) {
  const TemporaryDirectory directory;
  WriteBytes(directory / "a", bytes);
  const std::string command = "zstd -q '" + directory / "a" + "'";
  return std::system(command.c_str()) == 0 ? ReadBytes(directory / "a.zst") : "";
}

// A policy's lines, and bytes that no compression makes smaller, which it therefore stores.
std::string PolicyArchive(int filter) {
  std::mt19937 random(7);
  std::string noise;
  std::generate_n(std::back_inserter(noise), 48, [&] { return static_cast<char>(random()); });
  return Archive(ARCHIVE_FORMAT_TAR_USTAR, filter)
      .File("domains/appDom", "-s mount revoke\n-s open grant\n")
      .Symlink("link", "domains")
      .File("noise", noise)
      .Bytes();
}

// Two members, the border between them inside an entry.
std::string GzipOfTwoMembers() {
  const std::string archive = PolicyArchive(ARCHIVE_FILTER_NONE);
  return StoredGzip(archive.substr(0, 520)) + StoredGzip(archive.substr(520));
}

struct Compression {
  const char* name;
  std::function<std::string()> archive;
};

void PrintTo(const Compression& compression, std::ostream* stream) { *stream << compression.name; }

class DamagedArchiveTest : public testing::TestWithParam<Compression> {
 protected:
  void SetUp() override {
    try {
      bytes_ = GetParam().archive();
    } catch (const std::runtime_error& error) {
      GTEST_SKIP() << "this archive library cannot write it: " << error.what();
    }
    if (bytes_.empty()) GTEST_SKIP() << "the program zstd is not installed";
    content_ = ContentOf(bytes_);
    ASSERT_THAT(content_, testing::HasSubstr("-s mount revoke"));
  }

  std::string bytes_;
  std::string content_;
};

TEST_P(DamagedArchiveTest, NoFlippedBitAltersTheContent) {
  std::size_t refused = 0;
  for (std::size_t bit = 0; bit < bytes_.size() * 8; ++bit) {
    std::string damaged = bytes_;
    damaged[bit / 8] = static_cast<char>(damaged[bit / 8] ^ (1 << bit % 8));
    const std::string content = ContentOf(damaged);
    refused += IsRefused(content) ? 1 : 0;
    EXPECT_TRUE(IsRefused(content) || content == content_)
        << "bit " << bit % 8 << " of byte " << bit / 8 << " of " << bytes_.size();
  }
  EXPECT_GT(refused, bytes_.size() * 8 / 2);
}

TEST_P(DamagedArchiveTest, ACutArchiveIsRefused) {
  for (std::size_t size = 0; size < bytes_.size(); ++size) {
    EXPECT_TRUE(IsRefused(ContentOf(bytes_.substr(0, size))))
        << size << " bytes of " << bytes_.size();
  }
}

TEST_P(DamagedArchiveTest, WhatFollowsTheCompressedDataIsRefused) {
  // Zeros in multiples of four bytes would be padding, which is a part of the xz format.
  for (const std::string& tail :
       {std::string(1, '\0'), std::string(511, '\0'), std::string("x"), bytes_.substr(0, 1),
        bytes_.substr(0, bytes_.size() - 1), std::string("\x1f\x8b"), std::string(70000, 'x')}) {
    EXPECT_TRUE(IsRefused(ContentOf(bytes_ + tail)))
        << tail.size() << " bytes, the first " << static_cast<int>(tail[0]);
  }
}

TEST_P(DamagedArchiveTest, AWholeSecondArchiveIsRefused) {
  EXPECT_TRUE(IsRefused(ContentOf(bytes_ + bytes_)));
}

INSTANTIATE_TEST_SUITE_P(
    , DamagedArchiveTest,
    testing::Values(Compression{"Gzip", [] { return PolicyArchive(ARCHIVE_FILTER_GZIP); }},
                    Compression{"GzipOfTwoMembers", GzipOfTwoMembers},
                    Compression{"Bzip2", [] { return PolicyArchive(ARCHIVE_FILTER_BZIP2); }},
                    Compression{"Xz", [] { return PolicyArchive(ARCHIVE_FILTER_XZ); }},
                    Compression{"Lzip", [] { return PolicyArchive(ARCHIVE_FILTER_LZIP); }},
                    Compression{"Lz4", [] { return PolicyArchive(ARCHIVE_FILTER_LZ4); }},
                    Compression{"Zstd", [] { return Zstd(PolicyArchive(ARCHIVE_FILTER_NONE)); }}),
    [](const auto& tested) { return std::string(tested.param.name); });

// Nothing but headers has a checksum there: damage to a file's content cannot be noticed.
TEST(UncompressedArchiveTest, NoFlippedBitBesidesTheContentAltersTheArchive) {
  const std::string bytes = PolicyArchive(ARCHIVE_FILTER_NONE);
  const std::string content = ContentOf(bytes);
  for (std::size_t bit = 0; bit < bytes.size() * 8; ++bit) {
    std::string damaged = bytes;
    damaged[bit / 8] = static_cast<char>(damaged[bit / 8] ^ (1 << bit % 8));
    const std::string found = ContentOf(damaged);
    const std::size_t block = bit / 8 / 512;
    const std::size_t place = bit / 8 % 512;
    const bool isContent = (block == 1 && place < 30) || (block == 4 && place < 48);
    EXPECT_NE(isContent, IsRefused(found) || found == content)
        << "bit " << bit % 8 << " of byte " << bit / 8;
  }
}

// They have no checksums, or are no compressions at all.
TEST(ArchiveCompressionTest, OtherCompressionsAreNotRead) {
  for (const int filter : {ARCHIVE_FILTER_COMPRESS, ARCHIVE_FILTER_LZMA, ARCHIVE_FILTER_UU}) {
    EXPECT_EQ(ContentOf(PolicyArchive(filter)),
              std::string(kRefused) + "A: at byte 0: Unrecognized archive format");
  }
}

TEST(ArchiveCompressionTest, CompressedTwiceIsRefused) {
  const auto twice = [](int inner, int outer) {
    return ContentOf(Archive(ARCHIVE_FORMAT_RAW, outer).File("f", PolicyArchive(inner)).Bytes());
  };
  EXPECT_EQ(twice(ARCHIVE_FILTER_BZIP2, ARCHIVE_FILTER_XZ),
            std::string(kRefused) + "A: at byte 0: compressed more than once");
  EXPECT_EQ(twice(ARCHIVE_FILTER_GZIP, ARCHIVE_FILTER_XZ),
            std::string(kRefused) + "A: at byte 0: Unrecognized archive format");
  EXPECT_EQ(twice(ARCHIVE_FILTER_XZ, ARCHIVE_FILTER_GZIP),
            std::string(kRefused) + "A: at byte 0: Unrecognized archive format");
}

class DamagedTardiskTest : public HostFixture {
 protected:
  [[nodiscard]] std::string ErrorFor(const std::string& bytes) const {
    Tardisk("policy.tar.gz", bytes);
    return AssembleError();
  }
  [[nodiscard]] std::string File() const { return Path("tardisks/policy.tar.gz"); }
};

TEST_F(DamagedTardiskTest, ARevokeThatBecomesAGrantIsNamed) {
  const std::string whole = StoredGzip(PolicyArchive(ARCHIVE_FILTER_NONE));
  EXPECT_EQ(ErrorFor(whole), "(nothing was thrown)");
  std::string altered = whole;
  altered.replace(altered.find("revoke"), 6, "grant ");
  EXPECT_EQ(ErrorFor(altered), File() + ": at byte 0: damaged gzip data: incorrect data check");
  std::string tooLong = whole;
  ++tooLong[tooLong.size() - 4];
  EXPECT_EQ(ErrorFor(tooLong), File() + ": at byte 0: damaged gzip data: incorrect length check");
}

TEST_F(DamagedTardiskTest, WhatFollowsIsNamed) {
  const std::string whole = PolicyArchive(ARCHIVE_FILTER_GZIP);
  EXPECT_EQ(ErrorFor(whole + "x"),
            File() + ": at byte 3584: something follows the compressed data");
  EXPECT_EQ(ErrorFor(PolicyArchive(ARCHIVE_FILTER_BZIP2) + "x"),
            File() + ": at byte 3584: something follows the compressed data");
}

}  // namespace
}  // namespace StandIn
