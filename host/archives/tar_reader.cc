#include "host/archives/tar_reader.h"

#include <archive.h>
#include <archive_entry.h>
#include <locale.h>  // NOLINT(modernize-deprecated-headers): newlocale is POSIX, not C++
#include <sys/stat.h>

#include <cerrno>
#include <limits>
#include <new>
#include <utility>

#include "host/text/quoted_name.h"

namespace StandIn {

namespace {

la_ssize_t ReadBlock(archive* reader, void* streamPointer, const void** buffer) {
  auto& stream = *static_cast<UnpackedStream*>(streamPointer);
  std::string_view block;
  switch (stream.Next(block)) {
    case UnpackedStream::Result::kBlock:
      *buffer = block.data();
      return static_cast<la_ssize_t>(block.size());
    case UnpackedStream::Result::kEnd:
      return 0;
    case UnpackedStream::Result::kError:
      break;
  }
  ::archive_set_error(reader, EINVAL, "%s", stream.Error().c_str());
  return -1;
}

EntryKind KindOf(archive_entry* entry) {
  if (::archive_entry_hardlink(entry) != nullptr) {
    return EntryKind::kHardLink;
  }
  switch (::archive_entry_filetype(entry)) {
    case AE_IFREG:
      return EntryKind::kFile;
    case AE_IFDIR:
      return EntryKind::kDirectory;
    case AE_IFLNK:
      return EntryKind::kSymlink;
    case AE_IFIFO:
      return EntryKind::kFifo;
    case AE_IFCHR:
    case AE_IFBLK:
      return EntryKind::kDevice;
    default:
      return EntryKind::kOther;
  }
}

std::string TextOf(const char* text) { return text != nullptr ? text : ""; }

// Without a map of its parts a file is one part. Damaged maps may add up to anything.
std::uint64_t HeldBytes(archive_entry* entry, std::uint64_t size) {
  if (::archive_entry_sparse_reset(entry) == 0) {
    return size;
  }
  std::uint64_t held = 0;
  la_int64_t offset = 0;
  la_int64_t length = 0;
  while (::archive_entry_sparse_next(entry, &offset, &length) == ARCHIVE_OK) {
    const auto part = static_cast<std::uint64_t>(length);
    held = part > std::numeric_limits<std::uint64_t>::max() - held
               ? std::numeric_limits<std::uint64_t>::max()
               : held + part;
  }
  return held;
}

}  // namespace

// While it lives, this thread's locale is one in which the archive library can neither convert nor
// normalise a name, and therefore leaves its bytes alone.
class TarReader::NeutralLocale {
 public:
  NeutralLocale() : neutral_(::newlocale(LC_ALL_MASK, "C", nullptr)) {
    if (neutral_ == nullptr) {
      throw std::bad_alloc();
    }
  }
  ~NeutralLocale() { ::freelocale(neutral_); }
  NeutralLocale(const NeutralLocale&) = delete;
  NeutralLocale& operator=(const NeutralLocale&) = delete;

  template <typename Call>
  auto During(const Call& call) const {
    const locale_t previous = ::uselocale(neutral_);
    const auto result = call();
    ::uselocale(previous);
    return result;
  }

 private:
  locale_t neutral_;
};

TarReader::TarReader(int fd, std::string file, UnpackBudget& budget)
    : file_(std::move(file)),
      budget_(budget),
      stream_(fd, budget),
      reader_(NewArchiveReader()),
      locale_(std::make_unique<NeutralLocale>()) {
  ::archive_read_support_format_tar(reader_.get());
  if (::archive_read_open(reader_.get(), &stream_, nullptr, ReadBlock, nullptr) != ARCHIVE_OK) {
    RefuseAt(0, ErrorText());
  }
}

TarReader::~TarReader() = default;

bool TarReader::Next() {
  SkipContent();
  const std::uint64_t endOfEntries = Position();
  archive_entry* entry = nullptr;
  const int result =
      locale_->During([&] { return ::archive_read_next_header(reader_.get(), &entry); });
  hasEntry_ = false;
  if (result == ARCHIVE_EOF) {
    CheckEnd(endOfEntries);
    return false;
  }
  CheckHeader(result, endOfEntries);
  if (!budget_.TakeEntry()) {
    RefuseAt(endOfEntries, budget_.TooManyEntries());
  }
  Describe(entry);
  return true;
}

void TarReader::SkipContent() {
  if (hasEntry_ && ::archive_read_data_skip(reader_.get()) != ARCHIVE_OK) {
    RefuseEntry(ErrorText());
  }
}

void TarReader::CheckHeader(int result, std::uint64_t position) const {
  // A warning is either about a name that is not of the locale's characters, which is as it should
  // be, or about a header of which something had to be passed over.
  const bool isAboutCharacters =
      result == ARCHIVE_WARN && ErrorText().find("can't be converted") != std::string::npos;
  if (result != ARCHIVE_OK && !isAboutCharacters) {
    RefuseAt(position, ErrorText());
  }
}

void TarReader::CheckEnd(std::uint64_t endOfEntries) {
  const std::uint64_t end = Position();
  if (end == endOfEntries) {
    RefuseAt(end, "the mark of the archive's end is missing");
  }
  std::string_view block;
  UnpackedStream::Result result = UnpackedStream::Result::kBlock;
  while (result == UnpackedStream::Result::kBlock) {
    result = stream_.Next(block);
  }
  if (result == UnpackedStream::Result::kError) {
    RefuseAt(end, stream_.Error());
  }
  if (stream_.EndOfContent() > end) {
    RefuseAt(end, "something follows the archive's end");
  }
}

void TarReader::Describe(archive_entry* entry) {
  entry_.name = TextOf(::archive_entry_pathname(entry));
  entry_.kind = KindOf(entry);
  entry_.target = TextOf(entry_.kind == EntryKind::kHardLink ? ::archive_entry_hardlink(entry)
                                                             : ::archive_entry_symlink(entry));
  entry_.mode = ::archive_entry_perm(entry);
  entry_.size = static_cast<std::uint64_t>(::archive_entry_size(entry));
  entry_.held = HeldBytes(entry, entry_.size);
  hasEntry_ = true;
  if (entry_.size > entry_.held && !budget_.TakeBytes(entry_.size - entry_.held)) {
    RefuseEntry(budget_.TooManyBytes());
  }
}

void TarReader::ReadContent(const Sink& sink) {
  std::uint64_t end = 0;
  std::uint64_t total = 0;
  for (;;) {
    const void* bytes = nullptr;
    std::size_t size = 0;
    la_int64_t position = 0;
    const int result = ::archive_read_data_block(reader_.get(), &bytes, &size, &position);
    if (result == ARCHIVE_EOF) {
      break;
    }
    if (result != ARCHIVE_OK) {
      RefuseEntry(ErrorText());
    }
    const auto offset = static_cast<std::uint64_t>(position);
    if (offset < end || offset > entry_.size || size > entry_.size - offset) {
      RefuseEntry("the parts of the file lie outside of its " + std::to_string(entry_.size) +
                  " bytes, or overlap");
    }
    sink(offset, {static_cast<const char*>(bytes), size});
    end = offset + size;
    total += size;
  }
  if (total < entry_.held) {
    RefuseEntry("the file is said to have " + std::to_string(entry_.held) +
                " bytes here, but the archive holds " + std::to_string(total));
  }
}

void TarReader::RefuseEntry(const std::string& reason) const {
  throw HostError(file_ + ": entry " + QuotedName(entry_.name) + ": " + reason);
}

void TarReader::RefuseAt(std::uint64_t position, const std::string& reason) const {
  throw HostError(file_ + ": at byte " + std::to_string(position) + ": " + reason);
}

std::uint64_t TarReader::Position() const {
  return static_cast<std::uint64_t>(::archive_filter_bytes(reader_.get(), 0));
}

std::string TarReader::ErrorText() const {
  if (!stream_.Error().empty()) {
    return stream_.Error();  // the cause of whatever the reader made of it
  }
  const char* text = ::archive_error_string(reader_.get());
  return text != nullptr ? text : "the archive is damaged";
}

}  // namespace StandIn
