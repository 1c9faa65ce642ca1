#include "tests/support/child_process.h"

#include <grp.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <exception>
#include <fstream>
#include <stdexcept>

namespace StandIn {

namespace {

constexpr int kNotPermittedStatus = 77;

int StatusOf(pid_t child) {
  int status = 0;
  if (::waitpid(child, &status, 0) != child || !WIFEXITED(status)) {
    return -1;
  }
  return WEXITSTATUS(status);
}

void BecomeOrdinaryUser() {
  if (::getuid() != 0) {
    return;
  }
  if (::setgroups(0, nullptr) != 0 || ::setgid(kOrdinaryUser) != 0 ||
      ::setuid(kOrdinaryUser) != 0) {
    throw std::runtime_error("cannot become an ordinary user");
  }
}

bool WriteOwn(const std::string& file, const std::string& text) {
  std::ofstream stream("/proc/self/" + file);
  stream << text << std::flush;
  return stream.good();
}

// Who may not mount may do so among mounts of its own, as long as it is somebody there.
bool EnterUserNamespace() {
  const std::string user = std::to_string(::getuid());
  const std::string group = std::to_string(::getgid());
  return ::unshare(CLONE_NEWUSER | CLONE_NEWNS) == 0 && WriteOwn("setgroups", "deny") &&
         WriteOwn("uid_map", user + " " + user + " 1") &&
         WriteOwn("gid_map", group + " " + group + " 1");
}

// Mounts of this process are no longer anyone else's.
bool LeaveMounts() {
  return (::unshare(CLONE_NEWNS) == 0 || EnterUserNamespace()) &&
         ::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0;
}

ChildResult RunMounted(const std::function<bool()>& mount, const std::function<void()>& body) {
  const pid_t child = StartChild([&] {
    if (!LeaveMounts() || !mount()) {
      ::_exit(kNotPermittedStatus);
    }
    body();
  });
  switch (StatusOf(child)) {
    case 0:
      return ChildResult::kPassed;
    case kNotPermittedStatus:
      return ChildResult::kNotPermitted;
    default:
      return ChildResult::kFailed;
  }
}

}  // namespace

pid_t StartChild(const std::function<void()>& body) {
  std::fflush(nullptr);
  const pid_t child = ::fork();
  if (child < 0) {
    throw std::runtime_error("cannot fork");
  }
  if (child > 0) {
    return child;
  }
  bool failed = false;
  try {
    body();
  } catch (const std::exception& error) {
    std::printf("in a child process: %s\n", error.what());
    failed = true;
  }
  std::fflush(nullptr);
  ::_exit(failed || testing::Test::HasFailure() ? 1 : 0);
}

bool ChildPassed(pid_t child) { return StatusOf(child) == 0; }

bool PassesAsOrdinaryUser(const std::function<void()>& body) {
  return ChildPassed(StartChild([&] {
    BecomeOrdinaryUser();
    body();
  }));
}

void GiveToOrdinaryUser(const std::string& path) {
  if (::getuid() == 0 && ::chown(path.c_str(), kOrdinaryUser, kOrdinaryUser) != 0) {
    throw std::runtime_error("cannot give away " + path);
  }
}

ChildResult RunOnSmallFileSystem(const std::string& path, std::size_t bytes,
                                 const std::function<void()>& body) {
  const std::string options = "mode=0755,size=" + std::to_string(bytes);
  return RunMounted([&] { return ::mount("none", path.c_str(), "tmpfs", 0, options.c_str()) == 0; },
                    body);
}

ChildResult RunWithMount(const std::string& from, const std::string& to,
                         const std::function<void()>& body) {
  return RunMounted(
      [&] { return ::mount(from.c_str(), to.c_str(), nullptr, MS_BIND, nullptr) == 0; }, body);
}

}  // namespace StandIn
