// Questions about a policy are answered in the command's own process, and leave the host as it is.
#include <fcntl.h>
#include <linux/audit.h>
#include <linux/filter.h>
#include <linux/seccomp.h>
#include <signal.h>
#include <sys/mount.h>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <map>
#include <sstream>
#include <thread>

#include "tests/support/child_process.h"
#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

namespace fs = std::filesystem;
using testing::HasSubstr;

// What another process could see of a file: its kind, size, times of change and content.
std::string Appearance(const fs::path& path) {
  struct stat status {};
  if (lstat(path.c_str(), &status) != 0) return "gone";
  std::ostringstream text;
  text << status.st_mode << " " << status.st_size << " " << status.st_mtim.tv_sec << "."
       << status.st_mtim.tv_nsec << " " << status.st_ctim.tv_sec << "." << status.st_ctim.tv_nsec;
  if (S_ISREG(status.st_mode)) text << " " << std::ifstream(path).rdbuf();
  return text.str();
}

class InProcessTest : public CommandTest {
 protected:
  void SetUp() override {
    StandIn::Archive base;
    base.Directory("etc").File("etc/motd", "hello").File("etc/hosts", "");
    base.Directory("usr/bin").File("usr/bin/ls", "").Symlink("bin", "usr/bin");
    StandIn::Archive vendor;
    vendor.File("etc/olvane/secpolicy/tardisks/vendor", "-E vendorApp appDom\n");
    vendor.File("etc/olvane/secpolicy/objects/own", "ownLabel\nvendorApp\n");
    vendor.File("etc/olvane/secpolicy/domains/appDom", "-a ownLabel read grant\n");
    for (const char* domain : {"globalVMDom", "ioFilterDom"}) {
      vendor.File(std::string("etc/olvane/secpolicy/domains/") + domain, "");
    }
    vendor.File("etc/olvane/secpolicy/fileLabels/own", "/etc/* ownLabel\n");
    MakeHost({{"base.tar", base}, {"vendor.tar", vendor}});
    Policy("objects/base", "conf\nvendorApp\n");
    Policy("domains/appDom", "-s open grant\n-r /bin/ls rx\n-a conf read grant\n");
    Policy("domains/rootDom", "-d conf appDom exec grant\n");
    Policy("fileLabels/base", "/etc/* conf\n");
    ASSERT_EQ(Load().status, 0);
  }

  // Every verb that reads, and a dry run, with the words that stand behind "--host DIR".
  [[nodiscard]] std::vector<std::pair<Arguments, Arguments>> Questions() const {
    const std::string dir = PolicyDir();
    return {{{"show"}, {}},
            {{"check"}, {dir}},
            {{"diff"}, {dir, "kernel"}},
            {{"search"}, {dir, "--domain", "appDom"}},
            {{"may"}, {"--policy", dir, "appDom", "read", "/etc/motd"}},
            {{"who"}, {"--policy", dir, "syscall", "open"}},
            {{"graph"}, {dir}},
            {{"paths"}, {"--policy", dir, "rootDom", "appDom"}},
            {{"report"}, {dir, "-o", Path("report.html")}},
            {{"digest"}, {dir}},
            {{"digest"}, {"kernel"}},
            {{"label", "get"}, {"-R", "/etc"}},
            {{"label", "set"}, {"-n", "/etc/motd", "vendorApp"}},
            {{"label", "verify"}, {"--policy", dir, "-R", "/etc"}},
            {{"domain", "list"}, {}},
            {{"files", "list"}, {"appDom"}},
            {{"host", "info"}, {}}};
  }

  [[nodiscard]] Result Ask(
      const std::pair<Arguments, Arguments>& question,
      const std::function<void()>& prepare = [] {}) const {
    Arguments arguments = question.first;
    if (question.first.front() == "host") {
      arguments.push_back(Host());
    } else {
      arguments.insert(arguments.end(), {"--host", Host()});
    }
    arguments.insert(arguments.end(), question.second.begin(), question.second.end());
    return Command(arguments, prepare);
  }

  [[nodiscard]] std::map<std::string, std::string> HostFiles() const {
    std::map<std::string, std::string> files{{"", Appearance(Host())}};
    for (const fs::directory_entry& entry : fs::recursive_directory_iterator(Host())) {
      files[entry.path()] = Appearance(entry.path());
    }
    return files;
  }
};

std::string NameOf(const std::pair<Arguments, Arguments>& question) {
  std::string name;
  for (const std::string& word : question.first) name += word + " ";
  return name;
}

TEST_F(InProcessTest, ReadingVerbsLeaveTheHostAsItIs) {
  const auto before = HostFiles();
  for (const auto& question : Questions()) {
    const Result result = Ask(question);
    EXPECT_EQ(result.status, 0) << NameOf(question) << result.err;
    EXPECT_EQ(HostFiles(), before) << NameOf(question);
  }
}

TEST_F(InProcessTest, RightToReadIsEnough) {
  fs::permissions(Path(""), fs::perms(0755));
  EXPECT_TRUE(StandIn::PassesAsOrdinaryUser([&] {
    for (const auto& question : Questions()) {
      if (question.first.front() == "report") continue;  // writes its page beside the host
      const Result result = Ask(question);
      EXPECT_EQ(result.status, 0) << NameOf(question) << result.err;
    }
  }));
}

// Refuses what entering a host needs, and every new process, in this process from here on.
void ForbidProcessesAndNamespaces() {
  std::vector<sock_filter> filter{
      BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, nr)),
  };
  for (const long number : {
           SYS_unshare,
           SYS_mount,
           SYS_chroot,
           SYS_pivot_root,
           SYS_setns,
           SYS_open_tree,
           SYS_move_mount,
           SYS_clone,
           SYS_clone3,
           SYS_seccomp,
#ifdef SYS_fork
           SYS_fork,
           SYS_vfork,
#endif
       }) {
    filter.push_back(BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, static_cast<std::uint32_t>(number), 0, 1));
    filter.push_back(BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ERRNO | EPERM));
  }
  filter.push_back(BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ALLOW));
  const sock_fprog program{static_cast<unsigned short>(filter.size()), filter.data()};
  prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0);
  if (prctl(PR_SET_SECCOMP, SECCOMP_MODE_FILTER, &program) != 0) _exit(99);
}

TEST_F(InProcessTest, NeitherProcessesNorNamespacesAreNeeded) {
  for (const auto& question : Questions()) {
    // The page draws its graph by another program, where that is installed, and without it else.
    const Result result = Ask(question, ForbidProcessesAndNamespaces);
    EXPECT_EQ(result.status, 0) << NameOf(question) << result.err;
  }
  EXPECT_EQ(Command({"load", "--host", Host(), PolicyDir()}, ForbidProcessesAndNamespaces).status,
            0);
}

TEST_F(InProcessTest, NoProcIsNeeded) {
#if defined(SECPOLICY_ADDRESS_SANITIZER)
  GTEST_SKIP() << "the sanitizer reads its options and its process's threads from /proc";
#endif
  const StandIn::ChildResult result = StandIn::RunOnSmallFileSystem("/proc", 4096, [&] {
    ASSERT_FALSE(fs::exists("/proc/self"));
    for (const auto& question : Questions()) {
      const Result answer = Ask(question);
      EXPECT_EQ(answer.status, 0) << NameOf(question) << answer.err;
    }
  });
  if (result == StandIn::ChildResult::kNotPermitted) GTEST_SKIP() << "nothing can be mounted here";
  EXPECT_EQ(result, StandIn::ChildResult::kPassed);
}

// ---- The same path here and in the host ----

class SamePathTest : public InProcessTest {
 protected:
  // Runs `body` where the machine has `PolicyDir` at the path of the host's own policy directory.
  void WithMachinePolicy(const std::function<void()>& body) const {
    fs::create_directories(Path("etc/olvane"));
    fs::copy(PolicyDir(), Path("etc/olvane/secpolicy"), fs::copy_options::recursive);
    const StandIn::ChildResult result = StandIn::RunWithMount(Path("etc"), "/etc", body);
    if (result == StandIn::ChildResult::kNotPermitted) {
      GTEST_SKIP() << "nothing can be mounted here";
    }
    EXPECT_EQ(result, StandIn::ChildResult::kPassed);
  }
  [[nodiscard]] std::string DigestOf(const Arguments& source) const {
    Arguments arguments{"digest", "--host", Host()};
    arguments.insert(arguments.end(), source.begin(), source.end());
    return Done(arguments).out;
  }
};

TEST_F(SamePathTest, SameFilesHaveTheSameDigestWhereverTheyLie) {
  const std::string digest = DigestOf({PolicyDir()});
  WithMachinePolicy([&] { EXPECT_EQ(DigestOf({"/etc/olvane/secpolicy"}), digest); });
}

TEST_F(SamePathTest, LoadLabelsTheTardisksOfTheHost) {
  WithMachinePolicy([&] {
    const Result load = Command({"load", "--host", Host(), "/etc/olvane/secpolicy"});
    EXPECT_EQ(load.status, 0) << load.err;
    EXPECT_THAT(load.err, testing::Not(HasSubstr("Skipping tardisk policy")));
    EXPECT_THAT(Shown(), HasSubstr("/tardisks/vendor.tar (vendorApp)"));
  });
}

TEST_F(SamePathTest, HostsOwnDirectoryIsTheHostsWhatTheMachineHas) {
  const std::string own = Done({"load", "--host", Host()}).err;
  EXPECT_THAT(own, HasSubstr("set successfully"));
  const std::string shown = Shown();
  EXPECT_THAT(shown, HasSubstr("ownLabel"));
  WithMachinePolicy([&] {
    Done({"load", "--host", Host()});
    EXPECT_EQ(Shown(), shown);
  });
}

// ---- Signals ----

TEST_F(InProcessTest, SignalEndsAWaitingLoadAtOnce) {
  const int lock = open((Host() + "/kernel.lock").c_str(), O_RDWR | O_CLOEXEC);
  struct flock whole {};
  whole.l_type = F_WRLCK;
  ASSERT_EQ(fcntl(lock, F_OFD_SETLK, &whole), 0);
  for (const int number : {SIGINT, SIGTERM}) {
    const auto before = HostFiles();
    const pid_t child = fork();
    if (child == 0) {
      execl(SECPOLICY_COMMAND, "secpolicy", "load", "--host", Host().c_str(), PolicyDir().c_str(),
            nullptr);
      _exit(99);
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    ASSERT_EQ(kill(child, number), 0);
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == number) << status;
    EXPECT_EQ(HostFiles(), before);
  }
  close(lock);
}

}  // namespace
}  // namespace SecPolicyTool
