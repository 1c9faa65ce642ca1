#include "host/state/state_file.h"

#include <fcntl.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <charconv>
#include <chrono>
#include <thread>
#include <utility>

#include "host/files/system_failure.h"

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

// Whoever may make files in the host directory may change the host; nobody else may hold its lock.
mode_t LockFileMode(mode_t directory) {
  mode_t mode = S_IRUSR | S_IWUSR;
  if ((directory & S_IWGRP) != 0) mode |= S_IRGRP | S_IWGRP;
  if ((directory & S_IWOTH) != 0) mode |= S_IROTH | S_IWOTH;
  return mode;
}

struct stat StatusOf(int fd, const std::string& file) {
  struct stat status;
  if (::fstat(fd, &status) != 0) throw SystemFailure(file, "read", errno);
  return status;
}

// A fifo or a link of that name, or permissions that let others in, are not of this host's making.
UniqueFd OpenLockFile(const DirectoryRef& dir) {
  const std::string file = dir.PathOf(kLockFile);
  const mode_t mode = LockFileMode(StatusOf(dir.fd, dir.path).st_mode);
  UniqueFd fd(::openat(dir.fd, kLockFile,
                       O_RDWR | O_CREAT | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC, mode));
  if (!fd.IsOpen()) throw SystemFailure(file, "opened", errno);
  const struct stat status = StatusOf(fd.Get(), file);
  if (!S_ISREG(status.st_mode)) throw HostError(file + ": not a regular file");
  if (status.st_nlink > 1) throw HostError(file + ": has other names, which are not this host's");
  // Only its owner can; another writer takes it as it is.
  if ((status.st_mode & ALLPERMS) != mode) ::fchmod(fd.Get(), mode);
  return fd;
}

// The lock file holds the number of the process that locked it last: the kernel does not know whose
// a lock of an open file description is.
constexpr std::size_t kPidBytes = 16;

pid_t PidIn(int fd) {
  std::array<char, kPidBytes> text{};
  const ssize_t size = ::pread(fd, text.data(), text.size(), 0);
  pid_t pid = 0;
  if (size > 0) std::from_chars(text.data(), text.data() + size, pid);
  return pid;
}

// Without it, as on a full disk, the lock is good and its holder remains unnamed.
void WritePid(int fd, pid_t pid) {
  if (PidIn(fd) == pid) return;
  const std::string text = std::to_string(pid) + "\n";
  if (::ftruncate(fd, 0) != 0 || ::pwrite(fd, text.data(), text.size(), 0) < 0) return;
}

std::string HolderOf(int fd) {
  struct flock range = WholeFile(F_WRLCK);
  if (::fcntl(fd, F_OFD_GETLK, &range) != 0) return "another process";
  pid_t pid = range.l_pid;
  if (pid <= 0 && range.l_type == F_WRLCK) pid = PidIn(fd);
  return pid > 0 ? "process " + std::to_string(pid) : "another process";
}

// False when another one holds it.
bool TryToLock(int fd, const std::string& file) {
  struct flock range = WholeFile(F_WRLCK);
  if (::fcntl(fd, F_OFD_SETLK, &range) == 0) return true;
  if (errno != EAGAIN && errno != EACCES && errno != EINTR) {
    throw SystemFailure(file, "locked", errno);
  }
  return false;
}

using Clock = std::chrono::steady_clock;

// By asking again and again: a call that waits can only be ended by a signal, and signals are the
// program's.
void AwaitLock(int fd, const std::string& file, std::chrono::seconds wait) {
  using std::chrono::microseconds;
  constexpr microseconds kLongestPause(2000);
  const Clock::time_point end = Clock::now() + wait;
  for (microseconds pause(200); !TryToLock(fd, file); pause = std::min(2 * pause, kLongestPause)) {
    if (Clock::now() >= end) {
      throw HostError(file + ": is locked by " + HolderOf(fd) + ", which kept it for the " +
                      std::to_string(wait.count()) + " seconds of waiting; \"--wait SECONDS\" " +
                      "waits longer");
    }
    std::this_thread::sleep_for(pause);
  }
}

// Whether the name still stands for the file that is locked; if it does not, others lock another.
bool IsNamed(const DirectoryRef& dir, int fd) {
  struct stat named;
  const struct stat locked = StatusOf(fd, dir.PathOf(kLockFile));
  return ::fstatat(dir.fd, kLockFile, &named, AT_SYMLINK_NOFOLLOW) == 0 &&
         named.st_ino == locked.st_ino && named.st_dev == locked.st_dev;
}

}  // namespace

// The lock belongs to an open file description which nothing but this object uses. A lock of the
// process (F_SETLKW) would be lost as soon as anything in the process closed another descriptor of
// the file, and two owners in one process would not exclude each other. One description kept from
// the start of the process would be shared with the children that it forks, and a parent and a
// child that share it would not exclude each other either. Opened anew for each Lock, it excludes
// everybody whatever forked when.
StateFile::Lock::Lock(const StateFile& state) : owner_(::getpid()) {
  if (state.changes_.otherWriters == OtherWriters::kRefused) RequireNoOtherWriters(state.dir_);
  do {
    fd_ = OpenLockFile(state.dir_);
    AwaitLock(fd_.Get(), state.dir_.PathOf(kLockFile), state.changes_.wait);
  } while (!IsNamed(state.dir_, fd_.Get()));
  WritePid(fd_.Get(), owner_);
}

// Closing alone would leave the lock to a child that was forked while it was held.
StateFile::Lock::~Lock() {
  if (::getpid() == owner_) {
    struct flock range = WholeFile(F_UNLCK);
    ::fcntl(fd_.Get(), F_OFD_SETLK, &range);
  }
}

StateFile::StateFile(int dirFd, std::string dirPath, const ChangeOptions& changes)
    : dir_{dirFd, std::move(dirPath)}, changes_(changes) {}

StateFile::Version StateFile::VersionOf(const struct stat& status) {
  return {true, status.st_ino, status.st_size, Nanoseconds(status.st_mtim),
          Nanoseconds(status.st_ctim)};
}

StateFile::Version StateFile::CurrentVersion() const {
  struct stat status;
  if (::fstatat(dir_.fd, kStateFile, &status, 0) != 0) {
    const int number = errno;
    if (number == ENOENT) {
      return {};
    }
    throw SystemFailure(dir_.PathOf(kStateFile), "read", number);
  }
  return VersionOf(status);
}

std::optional<TextReader> StateFile::Open() {
  Pin(OpenFileIfThere(dir_, kStateFile));
  if (!pinned_.IsOpen()) {
    return std::nullopt;
  }
  return ReaderOf(pinned_.Get(), dir_.PathOf(kStateFile));
}

std::optional<std::string> StateFile::Read() {
  const auto text = Open();
  return text ? std::optional(WholeText(*text)) : std::nullopt;
}

void StateFile::Write(const std::string& text) {
  Write([&text](const TextSink& sink) { sink(text); });
}

void StateFile::Write(const TextWriter& write) {
  ReplaceFile(dir_, kStateFile, write, Writers::kOne, Readers::kEverybody);
  Pin(UniqueFd(::openat(dir_.fd, kStateFile, O_PATH | O_CLOEXEC)));
}

void StateFile::Remove() {
  if (::unlinkat(dir_.fd, kStateFile, 0) != 0 && errno != ENOENT) {
    const int number = errno;
    throw SystemFailure(dir_.PathOf(kStateFile), "removed", number);
  }
}

void StateFile::Pin(UniqueFd fd) {
  pinned_ = std::move(fd);
  last_ =
      pinned_.IsOpen() ? VersionOf(StatusOf(pinned_.Get(), dir_.PathOf(kStateFile))) : Version();
}

}  // namespace StandIn
