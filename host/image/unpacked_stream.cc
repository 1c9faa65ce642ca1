#include "host/image/unpacked_stream.h"

#include <archive.h>

#include <array>
#include <new>

namespace StandIn {

namespace {

constexpr std::size_t kReadBytes = 65536;

using AddFilter = int (*)(archive*);

// Every compression that the archive library may read by itself. For others, and for any that it
// was built without, it starts a program that it finds on the way, which no archive may bring
// about.
constexpr std::array<AddFilter, 10> kFilters{
    ::archive_read_support_filter_bzip2, ::archive_read_support_filter_compress,
    ::archive_read_support_filter_gzip,  ::archive_read_support_filter_lz4,
    ::archive_read_support_filter_lzip,  ::archive_read_support_filter_lzma,
    ::archive_read_support_filter_rpm,   ::archive_read_support_filter_uu,
    ::archive_read_support_filter_xz,    ::archive_read_support_filter_zstd,
};

ArchivePtr NewReader() {
  ArchivePtr reader(::archive_read_new());
  if (!reader) {
    throw std::bad_alloc();
  }
  return reader;
}

// The library warns of a filter that would be a program, but only once it is there.
void AddOwnFilters(archive* reader) {
  for (const AddFilter add : kFilters) {
    if (add(NewReader().get()) == ARCHIVE_OK) {
      add(reader);
    }
  }
}

}  // namespace

void ArchiveCloser::operator()(archive* reader) const noexcept { ::archive_read_free(reader); }

UnpackedStream::UnpackedStream(int fd, UnpackBudget& budget)
    : fd_(fd), budget_(budget), reader_(NewReader()) {
  AddOwnFilters(reader_.get());
  ::archive_read_support_format_raw(reader_.get());
}

UnpackedStream::Result UnpackedStream::Fail(const std::string& error) {
  error_ = error;
  return Result::kError;
}

UnpackedStream::Result UnpackedStream::FailAsReaderSays() {
  const char* text = ::archive_error_string(reader_.get());
  return Fail(text != nullptr ? text : "the compression is damaged");
}

// The "raw" format makes one entry of all the bytes.
UnpackedStream::Result UnpackedStream::Open() {
  archive_entry* whole = nullptr;
  isOpen_ = ::archive_read_open_fd(reader_.get(), fd_, kReadBytes) == ARCHIVE_OK &&
            ::archive_read_next_header(reader_.get(), &whole) == ARCHIVE_OK;
  return isOpen_ ? Result::kBlock : FailAsReaderSays();
}

UnpackedStream::Result UnpackedStream::Next(std::string_view& block) {
  if (!isOpen_ && Open() == Result::kError) {
    return Result::kError;
  }
  const void* bytes = nullptr;
  std::size_t size = 0;
  la_int64_t offset = 0;
  const int result = ::archive_read_data_block(reader_.get(), &bytes, &size, &offset);
  if (result == ARCHIVE_EOF) {
    return Result::kEnd;
  }
  if (result != ARCHIVE_OK) {
    return FailAsReaderSays();
  }
  block = {static_cast<const char*>(bytes), size};
  if (!budget_.TakeBytes(size)) {
    return Fail(budget_.TooManyBytes());
  }
  if (const std::size_t last = block.find_last_not_of('\0'); last != std::string_view::npos) {
    endOfContent_ = delivered_ + last + 1;
  }
  delivered_ += size;
  return Result::kBlock;
}

}  // namespace StandIn
