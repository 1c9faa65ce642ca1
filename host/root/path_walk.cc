#include "host/root/path_walk.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <climits>
#include <utility>

namespace StandIn {

namespace {

constexpr int kMostLinks = 40;  // the kernel's own limit

bool FailWith(int number) {
  errno = number;
  return false;
}

// Takes the first component off `rest`; empty where there is none.
std::string TakeComponent(std::string& rest) {
  const std::size_t begin = rest.find_first_not_of('/');
  if (begin == std::string::npos) {
    rest.clear();
    return {};
  }
  const std::size_t end = rest.find('/', begin);
  std::string component = rest.substr(begin, end - begin);
  rest = end == std::string::npos ? std::string() : rest.substr(end);
  return component;
}

}  // namespace

bool PathWalk::Go(const std::string& path, LastLink lastLink) {
  if (path.empty()) return FailWith(ENOENT);
  if (path.size() >= PATH_MAX) return FailWith(ENAMETOOLONG);
  std::string rest = path;
  while (!rest.empty()) {
    // Whatever follows, be it a slash alone, has to be in a directory.
    if (!IsInDirectory()) return FailWith(ENOTDIR);
    const std::string name = TakeComponent(rest);
    if (name.empty() || name == ".") continue;
    if (name == "..") {
      if (!steps_.empty()) steps_.pop_back();
    } else if (!Enter(name, rest, lastLink)) {
      return false;
    }
  }
  return true;
}

bool PathWalk::Enter(const std::string& name, std::string& rest, LastLink lastLink) {
  UniqueFd fd(openat(Here(), name.c_str(), O_PATH | O_NOFOLLOW | O_CLOEXEC));
  struct stat status {};
  if (!fd.IsOpen() || fstat(fd.Get(), &status) != 0) return false;
  if (S_ISLNK(status.st_mode) && (lastLink == LastLink::kFollowed || !rest.empty())) {
    return FollowLink(fd, rest);
  }
  steps_.push_back({name, std::move(fd), S_ISDIR(status.st_mode)});
  return true;
}

bool PathWalk::FollowLink(const UniqueFd& link, std::string& rest) {
  if (++followed_ > kMostLinks) return FailWith(ELOOP);
  std::array<char, PATH_MAX> target;
  const ssize_t size = readlinkat(link.Get(), "", target.data(), target.size());
  if (size < 0) return false;
  if (size == 0) return FailWith(ENOENT);
  if (target.front() == '/') steps_.clear();
  rest.insert(0, target.data(), static_cast<std::size_t>(size));
  return rest.size() < PATH_MAX || FailWith(ENAMETOOLONG);
}

UniqueFd PathWalk::Open(int flags) const {
  const int all = flags | O_NOFOLLOW | O_CLOEXEC;
  if (steps_.empty()) return UniqueFd(openat(rootFd_, ".", all));
  const int above = steps_.size() == 1 ? rootFd_ : steps_[steps_.size() - 2].fd.Get();
  return UniqueFd(openat(above, steps_.back().name.c_str(), all));
}

std::string PathWalk::Path() const {
  std::string path;
  for (const Step& step : steps_) path += "/" + step.name;
  return path.empty() ? "/" : path;
}

}  // namespace StandIn
