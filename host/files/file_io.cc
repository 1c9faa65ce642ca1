#include "host/files/file_io.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <utility>

#include "host/files/system_failure.h"
#include "host/files/unique_fd.h"

namespace StandIn {

namespace {

// The name of what is to take the place of a file. A name of the process's own where there may be
// several of them; else always the same one, so that what a killed process left is found.
std::string NameInTheMaking(const std::string& finalName, Writers writers) {
  const std::string name = finalName + ".new";
  return writers == Writers::kOne ? name : name + "." + std::to_string(::getpid());
}

// A file that vanishes at the end of its scope unless it has been given its final name.
class TemporaryFile {
 public:
  TemporaryFile(int dirFd, std::string name) : dirFd_(dirFd), name_(std::move(name)) {}
  ~TemporaryFile() {
    if (exists_) {
      ::unlinkat(dirFd_, name_.c_str(), 0);
    }
  }
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;

  // Each returns 0 or an errno.
  int Make() {
    // A process that had this name too may have been killed half-way; what it left is of no use.
    ::unlinkat(dirFd_, name_.c_str(), 0);
    fd_ = UniqueFd(::openat(dirFd_, name_.c_str(),
                            O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0666));
    exists_ = fd_.IsOpen();
    return exists_ ? 0 : errno;
  }

  int LetEverybodyRead() { return ::fchmod(fd_.Get(), 0644) == 0 ? 0 : errno; }

  int Append(std::string_view text) {
    while (!text.empty()) {
      const ssize_t written = ::write(fd_.Get(), text.data(), text.size());
      if (written < 0) {
        if (errno == EINTR) {
          continue;
        }
        return errno;
      }
      text.remove_prefix(static_cast<std::size_t>(written));
    }
    return 0;
  }

  int Sync() { return ::fsync(fd_.Get()) == 0 ? 0 : errno; }

  int TakeName(const std::string& finalName) {
    if (::renameat(dirFd_, name_.c_str(), dirFd_, finalName.c_str()) != 0) {
      return errno;
    }
    exists_ = false;
    return 0;
  }

  // EEXIST when something has the name already. The temporary name vanishes with this object.
  int TakeFreeName(const std::string& finalName) {
    return ::linkat(dirFd_, name_.c_str(), dirFd_, finalName.c_str(), 0) == 0 ? 0 : errno;
  }

 private:
  int dirFd_;
  std::string name_;
  UniqueFd fd_;
  bool exists_ = false;
};

}  // namespace

void ReadBlocks(int fd, const std::string& file,
                const std::function<void(std::string_view block)>& sink) {
  std::array<char, 65536> buffer;
  for (;;) {
    const ssize_t got = ::read(fd, buffer.data(), buffer.size());
    if (got == 0) {
      return;
    }
    if (got > 0) {
      sink({buffer.data(), static_cast<std::size_t>(got)});
    } else if (errno != EINTR) {
      throw SystemFailure(file, "read", errno);
    }
  }
}

std::string ReadAll(int fd, const std::string& file) {
  std::string text;
  ReadBlocks(fd, file, [&](std::string_view block) { text += block; });
  return text;
}

TextReader ReaderOf(int fd, const std::string& file) {
  return [fd, file](std::size_t offset, std::span<char> into) {
    std::size_t size = 0;
    while (size < into.size()) {
      const ssize_t got =
          ::pread(fd, into.data() + size, into.size() - size, static_cast<off_t>(offset + size));
      if (got == 0) break;
      if (got > 0) {
        size += static_cast<std::size_t>(got);
      } else if (errno != EINTR) {
        throw SystemFailure(file, "read", errno);
      }
    }
    return size;
  };
}

UniqueFd OpenFileIfThere(const DirectoryRef& dir, const std::string& name) {
  const std::string file = dir.PathOf(name);
  // Without O_NONBLOCK a fifo of that name would hold the caller up for ever.
  UniqueFd fd(::openat(dir.fd, name.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
  if (!fd.IsOpen()) {
    if (errno == ENOENT) {
      return fd;
    }
    throw SystemFailure(file, "opened", errno);
  }
  struct stat status;
  if (::fstat(fd.Get(), &status) != 0) {
    throw SystemFailure(file, "read", errno);
  }
  if (!S_ISREG(status.st_mode)) {
    throw HostError(file + ": not a regular file");
  }
  return fd;
}

std::optional<std::string> ReadFileIfThere(const DirectoryRef& dir, const std::string& name) {
  const UniqueFd fd = OpenFileIfThere(dir, name);
  if (!fd.IsOpen()) {
    return std::nullopt;
  }
  return ReadAll(fd.Get(), dir.PathOf(name));
}

std::string ReadFile(const DirectoryRef& dir, const std::string& name) {
  std::optional<std::string> text = ReadFileIfThere(dir, name);
  if (!text) {
    throw SystemFailure(dir.PathOf(name), "opened", ENOENT);
  }
  return *std::move(text);
}

namespace {

TextWriter WriterOf(const std::string& text) {
  return [&text](const TextSink& sink) { sink(text); };
}

// False when the name has to be free and is not.
enum class Existing { kReplaced, kStays };
bool PutFile(const DirectoryRef& dir, const std::string& name, const TextWriter& write,
             Writers writers, Readers readers, Existing existing) {
  const auto check = [&](int number) {
    if (number != 0) {
      throw SystemFailure(dir.PathOf(name), "written", number);
    }
  };
  // Opened first: a directory that cannot be synced must be found out before anything is renamed.
  const UniqueFd directory(::openat(dir.fd, ".", O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  check(directory.IsOpen() ? 0 : errno);
  TemporaryFile file(directory.Get(), NameInTheMaking(name, writers));
  check(file.Make());
  if (readers == Readers::kEverybody) check(file.LetEverybodyRead());
  write([&](std::string_view part) { check(file.Append(part)); });
  check(file.Sync());
  const bool isReplaced = existing == Existing::kReplaced;
  const int taken = isReplaced ? file.TakeName(name) : file.TakeFreeName(name);
  if (!isReplaced && taken == EEXIST) {
    return false;
  }
  check(taken);
  check(::fsync(directory.Get()) == 0 ? 0 : errno);
  return true;
}

}  // namespace

bool MakeFileIfMissing(const DirectoryRef& dir, const std::string& name, const std::string& text) {
  return PutFile(dir, name, WriterOf(text), Writers::kSeveral, Readers::kByMask, Existing::kStays);
}

void ReplaceFile(const DirectoryRef& dir, const std::string& name, const std::string& text,
                 Writers writers, Readers readers) {
  ReplaceFile(dir, name, WriterOf(text), writers, readers);
}

void ReplaceFile(const DirectoryRef& dir, const std::string& name, const TextWriter& write,
                 Writers writers, Readers readers) {
  PutFile(dir, name, write, writers, readers, Existing::kReplaced);
}

}  // namespace StandIn
