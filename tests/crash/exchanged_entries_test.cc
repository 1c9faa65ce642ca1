// Hosts whose entries another process exchanges for links to the outside while they are assembled.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cstdio>
#include <filesystem>
#include <iostream>
#include <map>
#include <set>

#include "host/root/assemble.h"
#include "secpolicy/host/host_error.h"
#include "tests/crash/traced_process.h"
#include "tests/support/archives.h"
#include "tests/support/child_process.h"
#include "tests/support/temporary_directory.h"

namespace CrashTest {
namespace {

namespace fs = std::filesystem;
using StandIn::Archive;
using StandIn::HostDirectory;

// Which argument of a call names an entry, and which one is the descriptor of its directory.
struct NamingArguments {
  std::size_t directory;
  std::size_t name;
};

std::optional<NamingArguments> NamingArgumentsOf(std::uint64_t number) {
  static const std::map<std::uint64_t, NamingArguments> kCalls = {
      {SYS_openat, {0, 1}},    {SYS_openat2, {0, 1}},   {SYS_mkdirat, {0, 1}},
      {SYS_mknodat, {0, 1}},   {SYS_unlinkat, {0, 1}},  {SYS_renameat, {0, 1}},
      {SYS_renameat2, {0, 1}}, {SYS_linkat, {0, 1}},    {SYS_symlinkat, {1, 2}},
      {SYS_fchmodat, {0, 1}},  {SYS_fchownat, {0, 1}},  {SYS_newfstatat, {0, 1}},
      {SYS_faccessat, {0, 1}}, {SYS_faccessat2, {0, 1}}};
  const auto found = kCalls.find(number);
  if (found == kCalls.end()) return std::nullopt;
  return found->second;
}

// The path of the entry that a call names; empty when it names none, or by its descriptor alone.
std::string NamedEntry(const PendingCall& call) {
  const auto arguments = NamingArgumentsOf(call.number);
  if (!arguments) return {};
  const std::string name = call.TextAt(call.arguments[arguments->name]);
  if (name.empty() || name == "." || name.starts_with('/')) return name == "." ? "" : name;
  const auto fd = static_cast<int>(call.arguments[arguments->directory]);
  std::error_code error;
  const fs::path directory = fs::read_symlink(
      "/proc/" + std::to_string(call.process) + "/fd/" + std::to_string(fd), error);
  return error ? "" : (directory / name).string();
}

enum class Bait { kLinkToDirectory, kLinkToFile, kLinkInPlaceOfParent };

enum class User { kRoot, kOrdinary };

class ExchangedEntriesTest : public testing::TestWithParam<User> {
 protected:
  ExchangedEntriesTest() {
    fs::create_directories(Path("secret/sub"));
    StandIn::WriteBytes(Path("secret/key"), "text");
    StandIn::WriteBytes(Path("secret/sub/inner"), "text");
    for (const char* name : {"secret/key", "secret/sub/inner"}) SetMode(name, 0600);
    for (const char* name : {"secret/sub", "secret"}) SetMode(name, 0710);
  }

  void SetUp() override {
    if (!TracedProcess::IsPermitted()) GTEST_SKIP() << "processes cannot be traced here";
    if (geteuid() != 0) GTEST_SKIP() << "only root can play two users";
    GiveAway(Path("secret"));
    GiveAway(directory_.Path());
  }

  [[nodiscard]] std::string Path(const std::string& name) const { return base_ / name; }
  void SetMode(const std::string& name, mode_t mode) const {
    ASSERT_EQ(::chmod(Path(name).c_str(), mode), 0) << name;
  }

  // Everything belongs to the user that assembles, who could therefore change all of it.
  void GiveAway(const std::string& path) const {
    if (GetParam() == User::kRoot) return;
    StandIn::GiveToOrdinaryUser(path);
    if (!fs::is_directory(path)) return;
    for (const auto& entry : fs::recursive_directory_iterator(path)) {
      ASSERT_EQ(::lchown(entry.path().c_str(), StandIn::kOrdinaryUser, StandIn::kOrdinaryUser), 0);
    }
  }

  // A host with an image, an archive of everything that an archive may hold, and what an assembly
  // that was killed has left.
  void MakeHost() const {
    fs::remove_all(Path("host"));
    HostDirectory::Create(Path("host"), "{}");
    StandIn::WriteBytes(Path("host/tardisks/base.tar"), Archive()
                                                            .Directory("tmp", 0777)
                                                            .File("tmp/a/file", "text", 0666)
                                                            .Symlink("tmp/link", "a")
                                                            .HardLink("tmp/hard", "tmp/a/file")
                                                            .Fifo("tmp/fifo", 0666)
                                                            .Directory("tmp", 0755)
                                                            .Symlink("tmp/a/file", "elsewhere")
                                                            .Bytes());
    for (const char* tree : {"root", "root.new"}) {
      fs::create_directories(Path("host") + "/" + tree + "/a/b/c");
      StandIn::WriteBytes(Path("host") + "/" + tree + "/a/b/file", "old");
    }
    GiveAway(Path("host"));
    SetMode("host/root.new/a/b/c", 0500);
    SetMode("host/root.new/a/b", 0);
    SetMode("host/root.new/a", 0500);
  }

  [[noreturn]] void BecomeAssembly() const {
    alarm(60);
    if (GetParam() == User::kOrdinary &&
        (setgid(StandIn::kOrdinaryUser) != 0 || setuid(StandIn::kOrdinaryUser) != 0)) {
      _exit(3);
    }
    try {
      StandIn::Assemble(HostDirectory(Path("host")));
    } catch (const StandIn::HostError&) {
      _exit(1);
    }
    _exit(0);
  }

  // The numbers of those calls of an undisturbed assembly that name an entry of the host.
  [[nodiscard]] std::vector<int> NamingCalls() const {
    MakeHost();
    std::vector<int> numbers;
    TracedProcess assembly([&] { BecomeAssembly(); });
    for (int number = 0; const auto call = assembly.NextCall(); ++number) {
      if (IsOfHost(NamedEntry(*call))) numbers.push_back(number);
    }
    EXPECT_EQ(assembly.ExitStatus(), 0);
    return numbers;
  }

  // Lets an assembly run to its end, and exchanges what its call of that number names just before
  // the kernel looks.
  void AssembleWithExchangeAt(int number, Bait bait) const {
    MakeHost();
    TracedProcess assembly([&] { BecomeAssembly(); });
    std::string exchanged;
    for (int i = 0; const auto call = assembly.NextCall(); ++i) {
      if (i == number) exchanged = Exchange(NamedEntry(*call), bait);
    }
    EXPECT_TRUE(assembly.ExitStatus() == 0 || assembly.ExitStatus() == 1)
        << assembly.ExitStatus() << " with " << exchanged;
    EXPECT_EQ(Secret(), secret_) << "call " << number << ", " << exchanged;
  }

  // Everything about what lies outside the host but the times of the last access.
  [[nodiscard]] std::set<std::string> Secret() const {
    std::set<std::string> lines{LineOf(Path("secret"))};
    for (const auto& entry : fs::recursive_directory_iterator(Path("secret"))) {
      lines.insert(LineOf(entry.path()));
    }
    return lines;
  }
  void RememberSecret() { secret_ = Secret(); }

 private:
  [[nodiscard]] bool IsOfHost(const std::string& path) const {
    return path.starts_with(Path("host/"));
  }

  std::string Exchange(const std::string& entry, Bait bait) const {
    const std::string place =
        bait == Bait::kLinkInPlaceOfParent ? fs::path(entry).parent_path().string() : entry;
    if (!IsOfHost(place)) return "(nothing)";
    const std::string link = Path("link");
    fs::remove_all(link);
    fs::create_symlink(Path(bait == Bait::kLinkToFile ? "secret/key" : "secret"), link);
    if (GetParam() == User::kOrdinary) {
      EXPECT_EQ(::lchown(link.c_str(), StandIn::kOrdinaryUser, StandIn::kOrdinaryUser), 0);
    }
    if (renameat2(AT_FDCWD, link.c_str(), AT_FDCWD, place.c_str(), RENAME_EXCHANGE) != 0) {
      std::rename(link.c_str(), place.c_str());
    }
    return place;
  }

  static std::string LineOf(const fs::path& path) {
    struct stat status {};
    EXPECT_EQ(::lstat(path.c_str(), &status), 0);
    return path.string() + " " + std::to_string(status.st_mode) + " " +
           std::to_string(status.st_uid) + " " + std::to_string(status.st_nlink) + " " +
           std::to_string(status.st_ctim.tv_sec) + "." + std::to_string(status.st_ctim.tv_nsec) +
           " " + (S_ISREG(status.st_mode) ? StandIn::ReadBytes(path.string()) : "");
  }

  StandIn::TemporaryDirectory directory_;
  fs::path base_ = fs::canonical(directory_.Path());  // as the kernel names what is open
  std::set<std::string> secret_;
};

TEST_P(ExchangedEntriesTest, NothingOutsideTheHostIsTouched) {
  RememberSecret();
  const std::vector<int> calls = NamingCalls();
  ASSERT_GT(calls.size(), 40U);
  for (const int call : calls) {
    for (const Bait bait :
         {Bait::kLinkToDirectory, Bait::kLinkToFile, Bait::kLinkInPlaceOfParent}) {
      AssembleWithExchangeAt(call, bait);
      RememberSecret();  // each call that went wrong is reported once
    }
  }
  std::cout << calls.size() << " calls of an assembly named entries; each was exchanged\n";
}

INSTANTIATE_TEST_SUITE_P(, ExchangedEntriesTest, testing::Values(User::kRoot, User::kOrdinary),
                         [](const auto& tested) {
                           return tested.param == User::kRoot ? "AsRoot" : "AsOrdinaryUser";
                         });

}  // namespace
}  // namespace CrashTest
