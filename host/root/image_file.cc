#include "host/root/image_file.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>
#include <chrono>
#include <thread>

#include "host/files/file_io.h"
#include "host/files/system_failure.h"

namespace StandIn {

namespace {

// An assembly is without an index for as long as it takes to exchange two directories and to write
// a file; one that was killed meanwhile, for ever.
constexpr int kAttempts = 50;
constexpr std::chrono::milliseconds kPause(20);

bool HasRoot(const DirectoryRef& host) {
  struct stat status;
  return ::fstatat(host.fd, kRootDirectory, &status, AT_SYMLINK_NOFOLLOW) == 0;
}

// Whether image.json is the open file `index` still, or is still missing. An open file keeps its
// number from being given to another one.
bool IsIndexOf(const DirectoryRef& host, const UniqueFd& index) {
  struct stat named;
  if (::fstatat(host.fd, kIndexFile, &named, AT_SYMLINK_NOFOLLOW) != 0) return !index.IsOpen();
  struct stat open;
  return index.IsOpen() && ::fstat(index.Get(), &open) == 0 && open.st_ino == named.st_ino &&
         open.st_dev == named.st_dev;
}

}  // namespace

// An assembly removes the index before it changes anything else: as long as the index is the same,
// so is what it describes.
std::optional<ImageIndex> ReadImage(const HostDirectory& host,
                                    const std::function<void()>& readRest) {
  const DirectoryRef dir = host.Ref();
  for (int attempt = 1;; ++attempt) {
    const UniqueFd index = OpenFileIfThere(dir, kIndexFile);
    const bool isLast = attempt == kAttempts;
    if (index.IsOpen() || isLast || !HasRoot(dir)) {
      readRest();
      if (IsIndexOf(dir, index)) {
        if (!index.IsOpen()) return std::nullopt;
        const std::string file = dir.PathOf(kIndexFile);
        return ParseImageIndex(ReaderOf(index.Get(), file), file);
      }
      if (isLast) throw HostError(dir.path + ": was assembled again and again while it was read");
    }
    std::this_thread::sleep_for(kPause);
  }
}

}  // namespace StandIn
