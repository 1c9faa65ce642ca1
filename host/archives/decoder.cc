#include "host/archives/decoder.h"

#include <archive.h>
#include <sys/stat.h>
#include <unistd.h>
#include <zlib.h>

#include <array>
#include <cerrno>
#include <cstring>
#include <new>

#include "host/archives/archive_ptr.h"

namespace StandIn {

namespace {

constexpr std::size_t kDecoderBytes = 65536;

constexpr char kTrailingData[] = "something follows the compressed data";

// gzip, by zlib: the archive library's filter verifies neither the checksum nor the length.
class GzipDecoder final : public Decoder {
 public:
  explicit GzipDecoder(int fd) : fd_(fd) {
    constexpr int kGzipOnly = 16;
    if (::inflateInit2(&stream_, MAX_WBITS + kGzipOnly) != Z_OK) throw std::bad_alloc();
  }
  ~GzipDecoder() override { ::inflateEnd(&stream_); }

  Result Next(std::string_view& block) override {
    stream_.next_out = output_.data();
    stream_.avail_out = static_cast<uInt>(output_.size());
    while (stream_.avail_out == output_.size()) {
      if (stream_.avail_in == 0 && !Fill()) return Result::kError;
      if (isAtStart_ && stream_.avail_in == 0) return Result::kEnd;
      if (Inflate() == Result::kError) return Result::kError;
    }
    block = {reinterpret_cast<const char*>(output_.data()), output_.size() - stream_.avail_out};
    return Result::kBlock;
  }

 private:
  // Reads on; false after a failure.
  bool Fill() {
    ssize_t got = 0;
    do {
      got = ::pread(fd_, input_.data(), input_.size(), offset_);
    } while (got < 0 && errno == EINTR);
    if (got < 0) {
      Fail(std::strerror(errno));
      return false;
    }
    offset_ += got;
    stream_.next_in = input_.data();
    stream_.avail_in = static_cast<uInt>(got);
    return true;
  }

  Result Inflate() {
    if (stream_.avail_in == 0) return Fail("truncated gzip input");
    // A further member begins as the first one did; its second byte is zlib's to look at.
    if (isAtStart_ && *stream_.next_in != kMagic[0]) return Fail(kTrailingData);
    isAtStart_ = false;
    const int result = ::inflate(&stream_, Z_NO_FLUSH);
    if (result == Z_STREAM_END) {
      isAtStart_ = true;
      ::inflateReset(&stream_);
    } else if (result == Z_MEM_ERROR) {
      return Fail("not enough memory to decompress gzip data");
    } else if (result != Z_OK && result != Z_BUF_ERROR) {
      return Fail(std::string("damaged gzip data: ") +
                  (stream_.msg != nullptr ? stream_.msg : "a dictionary is needed"));
    }
    return Result::kBlock;
  }

 public:
  static constexpr std::array<unsigned char, 2> kMagic{0x1f, 0x8b};

 private:
  int fd_;
  off_t offset_ = 0;
  z_stream stream_{};
  bool isAtStart_ = true;  // of a member
  std::array<unsigned char, kDecoderBytes> input_;
  std::array<unsigned char, kDecoderBytes> output_;
};

using AddFilter = int (*)(archive*);

// The compressions with checksums that the archive library reads and verifies by itself. For one
// that it was built without, it starts a program that it finds in PATH, which no archive may bring
// about.
constexpr std::array<AddFilter, 5> kFilters{
    ::archive_read_support_filter_bzip2, ::archive_read_support_filter_lz4,
    ::archive_read_support_filter_lzip,  ::archive_read_support_filter_xz,
    ::archive_read_support_filter_zstd,
};

// All others, and uncompressed files, by the archive library.
class LibraryDecoder final : public Decoder {
 public:
  explicit LibraryDecoder(int fd) : fd_(fd), reader_(NewArchiveReader()) {
    // The library warns of a filter that would be a program, but only once it is there.
    for (const AddFilter add : kFilters) {
      if (add(NewArchiveReader().get()) == ARCHIVE_OK) add(reader_.get());
    }
    ::archive_read_support_format_raw(reader_.get());
  }

  Result Next(std::string_view& block) override {
    if (!isOpen_ && Open() == Result::kError) return Result::kError;
    const void* bytes = nullptr;
    std::size_t size = 0;
    la_int64_t offset = 0;
    const int result = ::archive_read_data_block(reader_.get(), &bytes, &size, &offset);
    if (result == ARCHIVE_EOF) return End();
    if (result != ARCHIVE_OK) return FailAsReaderSays();
    block = {static_cast<const char*>(bytes), size};
    return Result::kBlock;
  }

 private:
  // The "raw" format makes one entry of all the bytes.
  Result Open() {
    archive_entry* whole = nullptr;
    isOpen_ = ::archive_read_open_fd(reader_.get(), fd_, kDecoderBytes) == ARCHIVE_OK &&
              ::archive_read_next_header(reader_.get(), &whole) == ARCHIVE_OK;
    if (!isOpen_) return FailAsReaderSays();
    // The file itself counts as a filter. What follows an inner compression would not be noticed.
    constexpr int kFileAndCompression = 2;
    if (::archive_filter_count(reader_.get()) > kFileAndCompression) {
      return Fail("compressed more than once");
    }
    return Result::kBlock;
  }

  // The library ends where the compressed data does, whatever follows it.
  Result End() {
    constexpr int kFile = -1;
    struct stat status;
    if (::fstat(fd_, &status) != 0) return Fail(std::strerror(errno));
    return ::archive_filter_bytes(reader_.get(), kFile) < status.st_size ? Fail(kTrailingData)
                                                                         : Result::kEnd;
  }

  Result FailAsReaderSays() {
    const char* text = ::archive_error_string(reader_.get());
    return Fail(text != nullptr ? text : "the compression is damaged");
  }

  int fd_;
  ArchivePtr reader_;
  bool isOpen_ = false;
};

bool IsGzip(int fd) {
  std::array<unsigned char, 2> start{};
  return ::pread(fd, start.data(), start.size(), 0) == static_cast<ssize_t>(start.size()) &&
         start == GzipDecoder::kMagic;
}

}  // namespace

std::unique_ptr<Decoder> NewDecoder(int fd) {
  if (IsGzip(fd)) return std::make_unique<GzipDecoder>(fd);
  return std::make_unique<LibraryDecoder>(fd);
}

}  // namespace StandIn
