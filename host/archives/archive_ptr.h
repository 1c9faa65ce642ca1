// Ownership of the archive library's readers.
#pragma once

#include <archive.h>

#include <memory>
#include <new>

namespace StandIn {

struct ArchiveCloser {
  void operator()(archive* reader) const noexcept { ::archive_read_free(reader); }
};
using ArchivePtr = std::unique_ptr<archive, ArchiveCloser>;

// A reader without formats and filters.
inline ArchivePtr NewArchiveReader() {
  ArchivePtr reader(::archive_read_new());
  if (!reader) {
    throw std::bad_alloc();
  }
  return reader;
}

}  // namespace StandIn
