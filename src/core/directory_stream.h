// The entries of directories.
#pragma once

#include <dirent.h>

#include <memory>
#include <optional>
#include <string>

namespace SecPolicy {

struct DirectoryEntry {
  std::string name;
  unsigned char type;  // DT_REG, DT_DIR...; DT_UNKNOWN where the file system does not report it
};

// An open directory, closed with this object.
class DirectoryStream {
 public:
  // Takes over an open directory, or null, as the functions of core/file_access.h return it.
  explicit DirectoryStream(DIR* directory) noexcept : directory_(directory) {}

  [[nodiscard]] bool IsOpen() const noexcept { return directory_ != nullptr; }

  // The next entry other than "." and "..", in the directory's own order; nothing at the end and
  // after a read error, which are not told apart. The directory must be open.
  std::optional<DirectoryEntry> Next();

 private:
  struct Close {
    void operator()(DIR* directory) const noexcept { closedir(directory); }
  };
  std::unique_ptr<DIR, Close> directory_;
};

}  // namespace SecPolicy
