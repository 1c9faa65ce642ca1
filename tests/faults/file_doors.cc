// The C library's functions for files and directories, as the library and its file streams call
// them: these stand before the C library's own, so that nothing is compiled differently.
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <string_view>

#include "tests/faults/doors.h"

namespace SecPolicyFaults {
namespace {

// The file stream that was opened last, and how much of it is still to be seen.
struct WatchedStream {
  int descriptor = -1;
  std::size_t bytes = 0;
};
WatchedStream stream;

constexpr std::size_t kPieceBytes = 64;  // small, so that policy files take several reads

struct OpenDirectory {
  const DIR* directory = nullptr;
  std::array<char, 1024> path{};
  bool hides = false;
};
std::array<OpenDirectory, 64> directories;

template <typename Function>
Function* Next(const char* name) {
  return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

OpenDirectory* Find(const DIR* directory) {
  const auto found = std::find_if(directories.begin(), directories.end(),
                                  [&](const auto& open) { return open.directory == directory; });
  return found == directories.end() ? nullptr : &*found;
}

void Remember(const DIR* directory, std::string_view path) {
  OpenDirectory* const free = Find(nullptr);
  if (free == nullptr || path.size() >= free->path.size()) return;
  free->directory = directory;
  free->path.fill('\0');
  path.copy(free->path.data(), path.size());
  free->hides = IsHiding(path);
}

bool IsDot(std::string_view name) { return name == "." || name == ".."; }

using OpenFunction = FILE*(const char* path, const char* mode);

FILE* OpenStream(OpenFunction& real, const char* path, const char* mode) {
  if (!IsWatched()) return real(path, mode);
  Record(EventKind::kFile, "fopen", path);
  const Verdict verdict = Pass(Door::kOpenStream);
  if (verdict == Verdict::kFail) {
    errno = EIO;
    return nullptr;
  }
  FILE* const file = real(path, mode);
  stream = {file == nullptr ? -1 : fileno(file),
            verdict == Verdict::kFailGently ? 0 : SeenBytes(path)};
  return file;
}

}  // namespace
}  // namespace SecPolicyFaults

using namespace SecPolicyFaults;

extern "C" DIR* opendir(const char* path) {
  static auto* const real = Next<DIR*(const char*)>("opendir");
  if (!IsWatched()) return real(path);
  Record(EventKind::kFile, "opendir", path);
  if (Pass(Door::kOpenDirectory) != Verdict::kPass) {
    errno = EIO;
    return nullptr;
  }
  DIR* const directory = real(path);
  if (directory != nullptr) Remember(directory, path);
  return directory;
}

extern "C" int closedir(DIR* directory) {
  static auto* const real = Next<int(DIR*)>("closedir");
  OpenDirectory* const known = Find(directory);
  if (known != nullptr) {
    if (IsWatched()) Record(EventKind::kFile, "closedir", known->path.data());
    known->directory = nullptr;
  }
  return real(directory);
}

extern "C" dirent64* readdir64(DIR* directory) {
  static auto* const real = Next<dirent64*(DIR*)>("readdir64");
  const OpenDirectory* const known = Find(directory);
  if (!IsWatched() || known == nullptr) return real(directory);
  Record(EventKind::kFile, "readdir", known->path.data());
  const Verdict verdict = Pass(Door::kReadDirectory);
  if (verdict == Verdict::kFail) errno = EIO;
  if (verdict != Verdict::kPass) return nullptr;
  dirent64* entry = real(directory);
  while (known->hides && entry != nullptr && !IsDot(entry->d_name) && !IsSeen(entry->d_name)) {
    entry = real(directory);
  }
  return entry;
}

extern "C" int open(const char* path, int flags, ...) {
  static auto* const real = Next<int(const char*, int, ...)>("open");
  mode_t mode = 0;
  if ((flags & (O_CREAT | O_TMPFILE)) != 0) {
    va_list arguments;
    va_start(arguments, flags);
    mode = va_arg(arguments, mode_t);
    va_end(arguments);
  }
  if (IsWatched()) {
    Record(EventKind::kFile, "open", path);
    if (Pass(Door::kOpen) == Verdict::kFail) {
      errno = EIO;
      return -1;
    }
  }
  return real(path, flags, mode);
}

extern "C" int fstat(int descriptor, struct stat* status) noexcept {
  static auto* const real = Next<int(int, struct stat*)>("fstat");
  if (IsWatched()) {
    Record(EventKind::kFile, "fstat");
    if (Pass(Door::kStatus) == Verdict::kFail) {
      errno = EIO;
      return -1;
    }
  }
  return real(descriptor, status);
}

// File streams open files by one or the other, as the C++ library was built.
extern "C" FILE* fopen(const char* path, const char* mode) {
  static auto* const real = Next<OpenFunction>("fopen");
  return OpenStream(*real, path, mode);
}

extern "C" FILE* fopen64(const char* path, const char* mode) {
  static auto* const real = Next<OpenFunction>("fopen64");
  return OpenStream(*real, path, mode);
}

extern "C" ssize_t read(int descriptor, void* buffer, size_t size) {
  static auto* const real = Next<ssize_t(int, void*, size_t)>("read");
  if (!IsWatched() || descriptor != stream.descriptor) return real(descriptor, buffer, size);
  Record(EventKind::kFile, "read");
  const Verdict verdict = Pass(Door::kRead);
  if (verdict == Verdict::kFail) {
    errno = EIO;
    return -1;
  }
  if (verdict == Verdict::kFailGently) return 0;
  const ssize_t count = real(descriptor, buffer, std::min({size, kPieceBytes, stream.bytes}));
  if (count > 0) stream.bytes -= static_cast<std::size_t>(count);
  return count;
}
