#include "host/root/tree_writer.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>
#include <utility>

#include "host/archives/entry_path.h"
#include "host/files/system_failure.h"
#include "host/root/beneath.h"

namespace StandIn {

namespace {

constexpr mode_t kRights = S_IRWXU | S_IRWXG | S_IRWXO;

// Throws if a call answered -1. `shown` is a function, since hardly any call fails.
template <typename Shown>
void Check(std::int64_t result, const Shown& shown, const char* done) {
  if (result < 0) {
    const int number = errno;
    throw SystemFailure(shown(), done, number);
  }
}

}  // namespace

// The directory that holds a path, and the path's last component.
struct TreeWriter::Place {
  UniqueFd directory;
  std::string name;
  std::string shown;

  void Check(int result, const char* done) const {
    StandIn::Check(
        result, [&] { return shown; }, done);
  }
};

NewFile::NewFile(UniqueFd fd, std::string shown) : fd_(std::move(fd)), shown_(std::move(shown)) {}

void NewFile::WriteAt(std::uint64_t offset, std::string_view bytes) {
  while (!bytes.empty()) {
    const ssize_t written =
        ::pwrite(fd_.Get(), bytes.data(), bytes.size(), static_cast<off_t>(offset));
    if (written < 0 && errno == EINTR) {
      continue;
    }
    Check(
        written, [&] { return shown_; }, "written");
    bytes.remove_prefix(static_cast<std::size_t>(written));
    offset += static_cast<std::uint64_t>(written);
  }
}

void NewFile::Finish(std::uint64_t size, mode_t mode) {
  Check(
      ::ftruncate(fd_.Get(), static_cast<off_t>(size)), [&] { return shown_; }, "written");
  Check(
      ::fchmod(fd_.Get(), mode & kRights), [&] { return shown_; }, "written");
}

TreeWriter::TreeWriter(DirectoryRef root) : root_(std::move(root)) {}

TreeWriter::Place TreeWriter::Locate(const std::string& path) const {
  const std::string parent = ParentOf(path);
  Place place{OpenBeneath(root_.fd, parent, O_PATH | O_DIRECTORY), path.substr(path.rfind('/') + 1),
              root_.path + path};
  Check(
      place.directory.Get(), [&] { return root_.path + parent; }, "opened");
  return place;
}

void TreeWriter::MakeDirectory(const std::string& path, mode_t mode) const {
  const Place place = Locate(path);
  place.Check(::mkdirat(place.directory.Get(), place.name.c_str(), S_IRWXU), "made");
  SetDirectoryMode(path, mode);
}

void TreeWriter::SetDirectoryMode(const std::string& path, mode_t mode) const {
  const UniqueFd directory = OpenBeneath(root_.fd, path, O_RDONLY | O_DIRECTORY);
  const auto shown = [&] { return root_.path + path; };
  Check(directory.Get(), shown, "opened");
  Check(::fchmod(directory.Get(), (mode & kRights) | S_IRWXU), shown, "made");
}

void TreeWriter::MakeSymlink(const std::string& path, const std::string& target) const {
  const Place place = Locate(path);
  place.Check(::symlinkat(target.c_str(), place.directory.Get(), place.name.c_str()), "made");
}

void TreeWriter::MakeFifo(const std::string& path, mode_t mode) const {
  const Place place = Locate(path);
  place.Check(::mkfifoat(place.directory.Get(), place.name.c_str(), S_IRUSR | S_IWUSR), "made");
  // Opened for both, a fifo doesn't wait for another process.
  const UniqueFd fifo(::openat(place.directory.Get(), place.name.c_str(),
                               O_RDWR | O_NONBLOCK | O_NOCTTY | O_NOFOLLOW | O_CLOEXEC));
  place.Check(fifo.Get(), "opened");
  struct stat status;
  place.Check(::fstat(fifo.Get(), &status), "read");
  if (!S_ISFIFO(status.st_mode))
    throw HostError(place.shown + ": was exchanged by another process");
  place.Check(::fchmod(fifo.Get(), mode & kRights), "made");
}

void TreeWriter::MakeHardLink(const std::string& path, const std::string& target) const {
  const Place from = Locate(target);
  const Place to = Locate(path);
  to.Check(
      ::linkat(from.directory.Get(), from.name.c_str(), to.directory.Get(), to.name.c_str(), 0),
      "made");
}

// By the descriptor, so that the file is the one that was read whatever its name stands for now.
bool TreeWriter::LinkFile(int fd, const std::string& path) const {
  const Place place = Locate(path);
  const std::string self = "/proc/self/fd/" + std::to_string(fd);
  return ::linkat(AT_FDCWD, self.c_str(), place.directory.Get(), place.name.c_str(),
                  AT_SYMLINK_FOLLOW) == 0;
}

NewFile TreeWriter::MakeFile(const std::string& path) const {
  Place place = Locate(path);
  UniqueFd fd(::openat(place.directory.Get(), place.name.c_str(),
                       O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, S_IRUSR | S_IWUSR));
  place.Check(fd.Get(), "made");
  return {std::move(fd), std::move(place.shown)};
}

void TreeWriter::Remove(const std::string& path) const {
  const Place place = Locate(path);
  place.Check(::unlinkat(place.directory.Get(), place.name.c_str(), 0), "removed");
}

}  // namespace StandIn
