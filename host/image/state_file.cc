#include "host/image/state_file.h"

#include <fcntl.h>

#include <cerrno>
#include <utility>

#include "host/image/system_failure.h"

namespace StandIn {

namespace {

struct flock WholeFile(short type) {
  struct flock range {};
  range.l_type = type;
  range.l_whence = SEEK_SET;
  return range;
}

long long Nanoseconds(const struct timespec& time) {
  return static_cast<long long>(time.tv_sec) * 1000000000 + time.tv_nsec;
}

}  // namespace

// The lock belongs to an open file description which nothing but this object uses. A lock of the
// process (F_SETLKW) would be lost as soon as anything in the process closed another descriptor of
// the file, and two owners in one process would not exclude each other. One description kept from
// the start of the process would be shared with the children that it forks, and a parent and a
// child that share it would not exclude each other either. Opened anew for each Lock, it excludes
// everybody whatever forked when.
StateFile::Lock::Lock(const StateFile& state, LockMode mode) : owner_(::getpid()) {
  const std::string file = state.dir_.PathOf(kLockFile);
  // A shared lock needs no right to write, so that a host can be looked at by those who cannot
  // change it.
  const int access = mode == LockMode::kShared ? O_RDONLY : O_RDWR;
  fd_ =
      UniqueFd(::openat(state.dir_.fd, kLockFile, access | O_CREAT | O_NOFOLLOW | O_CLOEXEC, 0666));
  if (!fd_.IsOpen()) {
    throw SystemFailure(file, "opened", errno);
  }
  struct flock range = WholeFile(mode == LockMode::kShared ? F_RDLCK : F_WRLCK);
  while (::fcntl(fd_.Get(), F_OFD_SETLKW, &range) != 0) {
    if (errno != EINTR) {
      throw SystemFailure(file, "locked", errno);
    }
  }
}

// Closing alone would leave the lock to a child that was forked while it was held.
StateFile::Lock::~Lock() {
  if (::getpid() == owner_) {
    struct flock range = WholeFile(F_UNLCK);
    ::fcntl(fd_.Get(), F_OFD_SETLK, &range);
  }
}

StateFile::StateFile(int dirFd, std::string dirPath) : dir_{dirFd, std::move(dirPath)} {}

StateFile::Version StateFile::CurrentVersion() const {
  struct stat status;
  if (::fstatat(dir_.fd, kStateFile, &status, 0) != 0) {
    const int number = errno;
    if (number == ENOENT) {
      return {};
    }
    throw SystemFailure(dir_.PathOf(kStateFile), "read", number);
  }
  return {true, status.st_ino, status.st_size, Nanoseconds(status.st_mtim),
          Nanoseconds(status.st_ctim)};
}

std::optional<std::string> StateFile::Read() {
  Pin();
  return ReadFileIfThere(dir_, kStateFile);
}

void StateFile::Write(const std::string& text) {
  ReplaceFile(dir_, kStateFile, text, Writers::kOne);
  Pin();
}

void StateFile::Remove() {
  if (::unlinkat(dir_.fd, kStateFile, 0) != 0 && errno != ENOENT) {
    const int number = errno;
    throw SystemFailure(dir_.PathOf(kStateFile), "removed", number);
  }
}

void StateFile::Pin() { pinned_ = UniqueFd(::openat(dir_.fd, kStateFile, O_PATH | O_CLOEXEC)); }

}  // namespace StandIn
