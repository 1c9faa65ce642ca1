// The entries of a tar archive.
#pragma once

#include <sys/types.h>

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>

#include "host/archives/archive_ptr.h"
#include "host/archives/unpack_budget.h"
#include "host/archives/unpacked_stream.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

enum class EntryKind { kFile, kDirectory, kSymlink, kHardLink, kFifo, kDevice, kOther };

struct TarEntry {
  std::string name;  // as the archive has it, up to a NUL
  EntryKind kind = EntryKind::kOther;
  std::string target;      // of a link
  mode_t mode = 0;         // all permission bits
  std::uint64_t size = 0;  // of the file's content, holes included
  std::uint64_t held = 0;  // of that, what the archive holds
};

// Reads every format of tar archives that the archive library reads, in the compressions of
// NewDecoder; names are bytes whatever the locale. Input that isn't such an archive, whole and
// without anything after its end, is refused by whichever call meets it: HostError "FILE: entry
// "NAME": TEXT" or, between entries, "FILE: at byte N: TEXT", where N counts the decompressed
// bytes.
class TarReader {
 public:
  // Reads from `fd`, which messages call `file`; `fd` and `budget` must outlive this object.
  // Nothing is read yet.
  TarReader(int fd, std::string file, UnpackBudget& budget);
  ~TarReader();
  TarReader(const TarReader&) = delete;
  TarReader& operator=(const TarReader&) = delete;

  // Goes on to the next entry, whose description stays until the next call; false at the end.
  bool Next();
  [[nodiscard]] const TarEntry& Entry() const { return entry_; }

  // Hands over the content of a file, block by block with its offset, in ascending order and within
  // `size`; what isn't handed over is zero. Content that is shorter than `held` is refused.
  using Sink = std::function<void(std::uint64_t offset, std::string_view bytes)>;
  void ReadContent(const Sink& sink);

  // Refuses the current entry for a reason of the caller's.
  [[noreturn]] void RefuseEntry(const std::string& reason) const;

 private:
  class NeutralLocale;

  void SkipContent();
  void CheckHeader(int result, std::uint64_t position) const;
  void CheckEnd(std::uint64_t endOfEntries);
  void Describe(archive_entry* entry);
  [[nodiscard]] std::uint64_t Position() const;
  [[nodiscard]] std::string ErrorText() const;
  [[noreturn]] void RefuseAt(std::uint64_t position, const std::string& reason) const;

  std::string file_;
  UnpackBudget& budget_;
  UnpackedStream stream_;
  ArchivePtr reader_;
  std::unique_ptr<NeutralLocale> locale_;
  TarEntry entry_;
  bool hasEntry_ = false;
};

}  // namespace StandIn
