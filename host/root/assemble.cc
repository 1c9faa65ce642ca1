#include "host/root/assemble.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <exception>
#include <new>
#include <string_view>
#include <utility>

#include "host/files/file_io.h"
#include "host/files/system_failure.h"
#include "host/root/image_index.h"
#include "host/root/image_layout.h"
#include "host/root/remove_tree.h"
#include "host/root/tree_writer.h"
#include "host/root/unpack.h"
#include "host/state/state_file.h"
#include "host/text/quoted_name.h"

namespace StandIn {

namespace {

constexpr mode_t kSharedDirectoryMode = 0755;
constexpr mode_t kArchiveCopyMode = 0644;

bool IsRegularFile(int fd, const std::string& file) {
  struct stat status;
  if (::fstat(fd, &status) != 0) throw SystemFailure(file, "read", errno);
  return S_ISREG(status.st_mode);
}

[[noreturn]] void RefuseOthers(const DirectoryRef& archives, const std::string& names) {
  throw HostError(archives.path + ": not a regular file: " + names);
}

// The names of the archives in byte order. All that are not files are named together; what is
// unpacked in the end is looked at once more, when it is open.
std::vector<std::string> ArchiveNames(const DirectoryRef& archives) {
  std::vector<std::string> names = ListDirectory(archives);
  std::sort(names.begin(), names.end());
  std::string others;
  for (const std::string& name : names) {
    const UniqueFd fd(::openat(archives.fd, name.c_str(), O_PATH | O_NOFOLLOW | O_CLOEXEC));
    if (!fd.IsOpen()) throw SystemFailure(archives.PathOf(name), "read", errno);
    if (!IsRegularFile(fd.Get(), archives.PathOf(name))) {
      others += (others.empty() ? "" : ", ") + QuotedName(name);
    }
  }
  if (!others.empty()) RefuseOthers(archives, others);
  return names;
}

UniqueFd OpenArchive(const DirectoryRef& archives, const std::string& name) {
  UniqueFd fd(::openat(archives.fd, name.c_str(),
                       O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
  if (!fd.IsOpen()) throw SystemFailure(archives.PathOf(name), "opened", errno);
  if (!IsRegularFile(fd.Get(), archives.PathOf(name))) RefuseOthers(archives, QuotedName(name));
  return fd;
}

// The root file system in the making: a directory that vanishes unless it is put into place.
class NewRoot {
 public:
  explicit NewRoot(const HostDirectory& host) : NewRoot(host.Ref()) {
    RemoveTree(host_, kNewRootDirectory);
    if (::mkdirat(host_.fd, kNewRootDirectory, S_IRWXU) != 0) {
      const int number = errno;
      throw SystemFailure(host_.PathOf(kNewRootDirectory), "made", number);
    }
    fd_ = OpenDirectory(host_, kNewRootDirectory);
    RequireOwn();
    Writer().MakeDirectory(kArchivesPath, kSharedDirectoryMode);
  }
  ~NewRoot() {
    try {
      RemoveTree(host_, kNewRootDirectory);
    } catch (const std::exception&) {
      // The next assembly tries again, and says why when it can't either.
    }
  }
  NewRoot(const NewRoot&) = delete;
  NewRoot& operator=(const NewRoot&) = delete;

  [[nodiscard]] TreeWriter Writer() const {
    return TreeWriter({fd_.Get(), host_.PathOf(kNewRootDirectory)});
  }

  // `archive` is the file of that name, open.
  void AddArchive(const UniqueFd& archive, const std::string& shown,
                  const std::string& name) const {
    const std::string path = std::string(kArchivesPath) + "/" + name;
    if (!Writer().LinkFile(archive.Get(), path)) CopyArchive(archive, shown, path);
  }

  // Exchanges it with the root file system that is there, which vanishes in its stead.
  void PutIntoPlace() const {
    // Until now nobody else could enter it, whatever permissions the directories in it have.
    Writer().SetDirectoryMode("/", kSharedDirectoryMode);
    const bool isSynced = ::syncfs(fd_.Get()) == 0;
    const bool isPlaced = isSynced && (Rename(RENAME_EXCHANGE) || (errno == ENOENT && Rename(0)));
    if (!isPlaced) {
      const int number = errno;
      throw SystemFailure(host_.PathOf(kRootDirectory), "put into place", number);
    }
  }

 private:
  // A constructor that ends, so that what the other one made vanishes when that one fails.
  explicit NewRoot(DirectoryRef host) : host_(std::move(host)) {}

  [[nodiscard]] bool Rename(unsigned int flags) const {
    return ::renameat2(host_.fd, kNewRootDirectory, host_.fd, kRootDirectory, flags) == 0;
  }

  // Whether what is open is the directory just made, which another process may have exchanged.
  void RequireOwn() const {
    struct stat status;
    if (::fstat(fd_.Get(), &status) != 0) {
      throw SystemFailure(host_.PathOf(kNewRootDirectory), "read", errno);
    }
    if (status.st_uid != ::geteuid() || (status.st_mode & (S_IRWXG | S_IRWXO)) != 0) {
      throw HostError(host_.PathOf(kNewRootDirectory) + ": was exchanged by another process");
    }
  }

  void CopyArchive(const UniqueFd& archive, const std::string& shown,
                   const std::string& path) const {
    if (::lseek(archive.Get(), 0, SEEK_SET) != 0) throw SystemFailure(shown, "read", errno);
    NewFile copy = Writer().MakeFile(path);
    std::uint64_t size = 0;
    ReadBlocks(archive.Get(), shown, [&](std::string_view block) {
      copy.WriteAt(size, block);
      size += block.size();
    });
    copy.Finish(size, kArchiveCopyMode);
  }

  DirectoryRef host_;
  UniqueFd fd_;
};

// Unpacks everything into `root`, filling `report`. The account of the paths, which is what takes
// memory, is gone when the shortage of it is reported.
ImageIndex UnpackAll(const DirectoryRef& archives, const NewRoot& root, const UnpackLimits& limits,
                     AssembleReport& report) {
  std::string shown = archives.path;
  try {
    UnpackBudget budget(limits);
    ImageLayout layout;
    const TreeWriter tree = root.Writer();
    for (const std::string& name : ArchiveNames(archives)) {
      shown = archives.PathOf(name);
      const UniqueFd fd = OpenArchive(archives, name);
      const std::uint64_t entries = Unpack({fd.Get(), name, shown}, budget, layout, tree);
      root.AddArchive(fd, shown, name);
      report.tardisks.push_back({name, entries});
      report.entries += entries;
    }
    return layout.Index();
  } catch (const std::bad_alloc&) {
    throw HostError(shown + ": there is not enough memory to unpack it; the tardisks before it " +
                    "hold " + std::to_string(report.entries) + " entries");
  }
}

void RemoveIndex(const DirectoryRef& host) {
  if (::unlinkat(host.fd, kIndexFile, 0) != 0 && errno != ENOENT) {
    const int number = errno;
    throw SystemFailure(host.PathOf(kIndexFile), "removed", number);
  }
}

}  // namespace

AssembleReport Assemble(const HostDirectory& host, const UnpackLimits& limits) {
  StateFile state(host);
  const StateFile::Lock lock(state);
  const UniqueFd fd = OpenDirectory(host.Ref(), kTardiskDirectory);
  const DirectoryRef archives{fd.Get(), host.Ref().PathOf(kTardiskDirectory)};
  if (host.Changes().otherWriters == OtherWriters::kRefused) RequireNoOtherWriters(archives);

  AssembleReport report;
  const NewRoot root(host);
  const ImageIndex index = UnpackAll(archives, root, limits, report);
  const std::string indexText = FormatImageIndex(index);
  // Without an index the host counts as not assembled, which is right while root/, the index and
  // the state don't belong together.
  RemoveIndex(host.Ref());
  root.PutIntoPlace();
  state.Remove();
  ReplaceFile(host.Ref(), kIndexFile, indexText, Writers::kOne, Readers::kEverybody);
  return report;
}

}  // namespace StandIn
