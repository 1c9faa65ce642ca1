#include "tests/crash/loading_host.h"

#include <fcntl.h>
#include <unistd.h>

#include <filesystem>

#include "host/files/unique_fd.h"
#include "tests/host/state/kept_module.h"

namespace CrashTest {

using StandIn::UniqueFd;

LoadingHost::LoadingHost(int domains, int rules) {
  MakeHost();
  Policy("objects/base", "oldObject\n");
  Policy("domains/appDom", "-s read grant\n-a oldObject read grant\n-r / r\n");
  EXPECT_EQ(Load().status, 0);
  oldState_ = State();

  Policy("objects/base", "oldObject\nnewObject\n");
  Policy("domains/appDom", "-s read revoke\n-r / rw\n");
  for (int domain = 0; domain < domains; ++domain) {
    std::string text = "-d newObject appDom exec grant\n";
    for (int rule = 1; rule < rules; ++rule) {
      text += rule % 10 == 0 ? "-r /data/" + std::to_string(rule) + " rw\n"
                             : "-p kill " + std::to_string(rule) + " grant\n";
    }
    Policy("domains/dom" + std::to_string(domain), text);
  }
  EXPECT_EQ(Load().status, 0);
  newState_ = State();
  names_ = Names();
}

std::string LoadingHost::State() const { return StandIn::ReadBytes(Host() + "/kernel.json"); }

void LoadingHost::SetState(const std::string& state) const {
  StandIn::WriteBytes(Host() + "/kernel.json", state);
}

void LoadingHost::BecomeLoad() const {
  const UniqueFd errors(
      open(Path("errors").c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_APPEND | O_CLOEXEC, 0600));
  dup2(errors.Get(), STDERR_FILENO);
#if defined(SECPOLICY_ADDRESS_SANITIZER)
  setenv("ASAN_OPTIONS", "detect_leaks=0", 1);
#endif
  const std::string host = Host();
  const std::string policy = PolicyDir();
  execl(SECPOLICY_COMMAND, "secpolicy", "load", "--host", host.c_str(), policy.c_str(), nullptr);
  _exit(127);
}

void LoadingHost::ExpectUsable() const {
  EXPECT_FALSE(IsLocked());
  EXPECT_EQ(StandIn::KeptModule(StandIn::HostDirectory(Host())).Domains().substr(0, 14),
            "rootDom appDom");
  const SecPolicyTool::Result next = Load();
  EXPECT_EQ(next.status, 0) << next.err;
  EXPECT_TRUE(State() == NewState()) << "the next load ends in another state";
  EXPECT_EQ(Names(), names_) << "after the next load";
}

std::set<std::string> LoadingHost::LeftOver() const {
  std::set<std::string> names = Names();
  for (const std::string& name : names_) names.erase(name);
  return names;
}

bool LoadingHost::IsLocked() const {
  const UniqueFd fd(open((Host() + "/kernel.lock").c_str(), O_RDWR | O_CLOEXEC));
  struct flock range {};
  range.l_type = F_WRLCK;
  EXPECT_EQ(fcntl(fd.Get(), F_OFD_GETLK, &range), 0);
  return range.l_type != F_UNLCK;
}

std::set<std::string> LoadingHost::Names() const {
  const std::vector<std::string> names = StandIn::NamesIn(Host());
  return {names.begin(), names.end()};
}

}  // namespace CrashTest
