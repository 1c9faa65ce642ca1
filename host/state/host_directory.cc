#include "host/state/host_directory.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>
#include <filesystem>
#include <system_error>

#include "host/files/system_failure.h"

namespace StandIn {

namespace {

std::string WithoutTrailingSlashes(std::string path) {
  while (path.size() > 1 && path.back() == '/') {
    path.pop_back();
  }
  return path;
}

UniqueFd OpenPath(const std::string& path) {
  return UniqueFd(::open(path.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
}

// A dangling symbolic link counts too: writing there would replace what somebody put there.
bool HasDescription(int fd) {
  struct stat status;
  return ::fstatat(fd, kDescriptionFile, &status, AT_SYMLINK_NOFOLLOW) == 0;
}

std::string InitHint(const std::string& path) {
  return "; make one with \"secpolicy host init " + path + "\"";
}

}  // namespace

void HostDirectory::Create(const std::string& path, const std::string& descriptionText) {
  const DirectoryRef names{-1, WithoutTrailingSlashes(path)};
  std::error_code error;
  std::filesystem::create_directories(names.path, error);
  if (error) {
    throw SystemFailure(names.path, "made", error.value());
  }
  const UniqueFd fd = OpenPath(names.path);
  if (!fd.IsOpen()) {
    throw SystemFailure(names.path, "opened", errno);
  }
  if (HasDescription(fd.Get())) {
    throw HostError(names.path + " is a host directory already");
  }
  if (::mkdirat(fd.Get(), kTardiskDirectory, 0777) != 0 && errno != EEXIST) {
    const int number = errno;
    throw SystemFailure(names.PathOf(kTardiskDirectory), "made", number);
  }
  // Another process may have made one meanwhile.
  if (!MakeFileIfMissing({fd.Get(), names.path}, kDescriptionFile, descriptionText)) {
    throw HostError(names.path + " is a host directory already");
  }
}

HostDirectory::HostDirectory(const std::string& path)
    : path_(WithoutTrailingSlashes(path)), fd_(OpenPath(path_)) {
  if (!fd_.IsOpen()) {
    const int number = errno;
    const HostError failure = SystemFailure(path_, "opened", number);
    throw number == ENOENT ? HostError(failure.what() + InitHint(path_)) : failure;
  }
  if (!HasDescription(fd_.Get())) {
    throw HostError(path_ + " is not a host directory: it has no " + kDescriptionFile +
                    InitHint(path_));
  }
}

}  // namespace StandIn
