// Archives for tests.
#pragma once

#include <archive.h>
#include <sys/types.h>

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

namespace StandIn {

// An archive as an ordinary packer would write it.
class Archive {
 public:
  // A format and a filter of the archive library.
  explicit Archive(int format = ARCHIVE_FORMAT_TAR_PAX_RESTRICTED, int filter = ARCHIVE_FILTER_NONE)
      : format_(format), filter_(filter) {}

  Archive& Directory(const std::string& name, mode_t mode = 0755);
  Archive& File(const std::string& name, const std::string& content, mode_t mode = 0644);
  Archive& Symlink(const std::string& name, const std::string& target);
  Archive& HardLink(const std::string& name, const std::string& target);
  Archive& Fifo(const std::string& name, mode_t mode = 0644);
  // A file of `size` bytes that has `content` at `offset` and holes elsewhere.
  Archive& SparseFile(const std::string& name, std::int64_t size, std::int64_t offset,
                      const std::string& content);

  // Throws std::runtime_error when the library cannot write this.
  [[nodiscard]] std::string Bytes() const;

 private:
  struct Entry {
    std::string name;
    mode_t type = 0;
    mode_t mode = 0;
    std::string content = "";
    std::string symlink = "";
    std::string hardLink = "";
    std::int64_t size = 0;
    std::int64_t offset = 0;
  };

  static void Write(archive* writer, const Entry& entry);

  int format_;
  int filter_;
  std::vector<Entry> entries_;
};

// The fields of a header that tests vary.
struct RawHeader {
  std::string name;
  char type = '0';
  std::string link = "";
  std::string size = "00000000000";
  std::string mode = "0000644";
};

// An archive put together block by block, as no packer would write it.
class RawArchive {
 public:
  RawArchive& Header(const RawHeader& header);
  // Content, padded to whole blocks.
  RawArchive& Content(const std::string& bytes);
  // An extended header with these keys and values, which concerns the next entry.
  RawArchive& Extended(const std::vector<std::pair<std::string, std::string>>& records);
  RawArchive& Bytes(const std::string& bytes);
  // The two empty blocks at an archive's end.
  RawArchive& End();

  [[nodiscard]] const std::string& Text() const { return bytes_; }

 private:
  std::string bytes_;
};

// A size as headers have it.
std::string OctalSize(std::uint64_t size);

}  // namespace StandIn
