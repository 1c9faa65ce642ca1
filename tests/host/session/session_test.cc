// What a process that has entered a host sees and does.
#include "host/session/session.h"

#include <gmock/gmock.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <unistd.h>

#include <fstream>

#include "host/attached_host.h"
#include "platform/sysinfo.h"
#include "platform/tavon_exception.h"
#include "platform/zek_access.h"
#include "tests/host/session/session_fixture.h"

namespace StandIn {
namespace {

namespace fs = std::filesystem;
using testing::ElementsAre;
using ZekCtl::Security::ZekAccessInterfaceImpl;

class SessionViewTest : public SessionTest {
 protected:
  SessionViewTest() {
    WriteBytes(Visible() + "/file", "policy\n");
    fs::create_symlink("file", Visible() + "/link");
    fs::create_directory(Visible() + "/sub");
  }

  [[nodiscard]] SessionOptions WithVisible() const {
    return {.visible = {Visible()}, .trace = {}, .faults = {}};
  }

  // What every user is to see inside.
  void ExpectTheHost() const {
    EXPECT_EQ(ReadBytes("/motd"), "hello\n");
    EXPECT_EQ(fs::current_path(), "/");
    EXPECT_FALSE(fs::exists(Path()));
    ExpectPolicy();
  }

  void ExpectPolicy() const {
    EXPECT_EQ(ReadBytes(Visible() + "/file"), "policy\n");
    EXPECT_TRUE(fs::is_symlink(Visible() + "/link"));
    EXPECT_EQ(fs::read_symlink(Visible() + "/link"), "file");
    EXPECT_TRUE(fs::is_directory(Visible() + "/sub"));
  }
};

TEST_F(SessionViewTest, RootIsTheHostsAndThePolicyIsWhereItWas) {
  Tardisk("base.tar", Archive().File("motd", "hello\n"));
  Assembled();
  InHost(WithVisible(), [&](Session&) { ExpectTheHost(); });
}

TEST_F(SessionViewTest, OrdinaryUserEntersAsHimself) {
  Tardisk("base.tar", Archive().File("motd", "hello\n"));
  AsOrdinaryUser([&] {
    Assembled();
    const uid_t user = geteuid();
    const gid_t group = getegid();
    Enter(WithVisible(), [&](Session& session) {
      ExpectTheHost();
      EXPECT_EQ(geteuid(), user);
      EXPECT_EQ(getegid(), group);
      EXPECT_EQ(session.Module().CreateDomain("netDom", DomainOrigin::kPolicy), 1u);
    });
  });
}

TEST_F(SessionViewTest, OrdinaryUserNeedsNoVisibleDirectory) {
  AsOrdinaryUser([&] {
    Assembled();
    Enter({}, [&](Session&) { EXPECT_FALSE(fs::exists(Visible())); });
  });
}

TEST_F(SessionViewTest, VisibleDirectoryIsSeenInsideOnly) {
  Assembled();
  InHost(WithVisible(), [&](Session&) { WriteBytes(Visible() + "/new", "made inside"); });
  EXPECT_TRUE(fs::is_empty(Path("root") + Visible()));
  EXPECT_EQ(ReadBytes(Visible() + "/new"), "made inside");
}

TEST_F(SessionViewTest, VisibleDirectoryIsSeenInsideOnlyAlsoWhereMountsAreShared) {
  if (geteuid() != 0) GTEST_SKIP() << "only root can share mounts";
  Assembled();
  const ChildResult result = RunWithMount(Visible(), Visible(), [&] {
    ASSERT_EQ(mount(nullptr, "/", nullptr, MS_REC | MS_SHARED, nullptr), 0);
    InHost(WithVisible(), [&](Session&) { ExpectPolicy(); });
    EXPECT_TRUE(fs::is_empty(Path("root") + Visible()));
  });
  EXPECT_EQ(result, ChildResult::kPassed);
}

TEST_F(SessionViewTest, VisibleDirectoryCoversWhatTheImageHasThere) {
  Tardisk("base.tar", Archive().File(Visible().substr(1) + "/image", "of the image"));
  Assembled();
  InHost(WithVisible(), [&](Session&) {
    EXPECT_FALSE(fs::exists(Visible() + "/image"));
    EXPECT_EQ(ReadBytes(Visible() + "/file"), "policy\n");
  });
  EXPECT_EQ(Content(Visible() + "/image"), "of the image");
}

TEST_F(SessionViewTest, LinksOfTheImageDoNotLeadOutOfIt) {
  const std::string top = fs::path(Visible()).begin().operator*().string() +
                          std::next(fs::path(Visible()).begin())->string();
  Tardisk("base.tar", Archive().Directory("kept").Symlink(top.substr(1), "/kept"));
  Assembled();
  InHost(WithVisible(), [&](Session&) {
    EXPECT_EQ(ReadBytes(Visible() + "/file"), "policy\n");
    EXPECT_EQ(ReadBytes("/kept" + Visible().substr(top.size()) + "/file"), "policy\n");
  });
  EXPECT_TRUE(fs::is_directory(Path("root/kept") + Visible().substr(top.size())));
}

TEST_F(SessionViewTest, SeveralDirectoriesAreVisible) {
  const std::string second = Visible() + "2";
  fs::create_directory(second);
  WriteBytes(second + "/other", "second\n");
  Assembled();
  InHost({.visible = {Visible(), second}, .trace = {}, .faults = {}}, [&](Session&) {
    EXPECT_EQ(ReadBytes(Visible() + "/file"), "policy\n");
    EXPECT_EQ(ReadBytes(second + "/other"), "second\n");
  });
}

TEST_F(SessionViewTest, VisibleLinkIsTheDirectoryBehindIt) {
  const std::string link = Visible() + "-link";
  fs::create_directory_symlink("policy", link);
  Assembled();
  InHost({.visible = {link}, .trace = {}, .faults = {}}, [&](Session&) {
    EXPECT_EQ(ReadBytes(link + "/file"), "policy\n");
    EXPECT_FALSE(fs::exists(Visible()));
  });
}

TEST_F(SessionTest, StateGoesFromOneProcessToTheNext) {
  Assembled();
  InHost([](Session& session) { session.Module().CreateDomain("netDom", DomainOrigin::kPolicy); });
  InHost([](Session& session) { EXPECT_EQ(session.Module().FindDomain("netDom"), 1u); });
}

TEST_F(SessionTest, PlatformsClassesReachTheHost) {
  Tardisk("base.tar", Archive().File("motd", "hello\n"));
  Assembled();
  InHost([](Session& session) {
    ZekAccessInterfaceImpl iface;
    EXPECT_EQ(iface.GetMaxDomains(), session.Module().MaxDomains());
    struct stat status {};
    ASSERT_EQ(stat("/motd", &status), 0);
    ZekCtl::Util::InodeStats stats{};
    ZekCtl::Util::Sysinfo service(ZekCtl::Util::kInodeStatsNode);
    service.AddInstancePath(status.st_ino);
    service.Get(&stats, sizeof stats);
    EXPECT_STREQ(stats.tardiskName, "base.tar");
  });
}

TEST_F(SessionTest, AfterItsEndThePlatformCannotBeReached) {
  Assembled();
  InChild([&] {
    Enter({}, [](Session&) { EXPECT_NE(Attached(), nullptr); });
    EXPECT_EQ(Attached(), nullptr);
    EXPECT_EQ(MessageOf<Tavon::Lib::TavonException>([] { ZekAccessInterfaceImpl iface; }),
              "the kernel's security module cannot be reached: no host has been entered");
  });
}

TEST_F(SessionTest, BatchIsKeptAtItsCommit) {
  Assembled();
  InHost([&](Session& session) {
    session.BeginBatch();
    session.Module().CreateDomain("oneDom", DomainOrigin::kPolicy);
    session.Commit();
    session.BeginBatch();
    session.Module().CreateDomain("twoDom", DomainOrigin::kPolicy);
  });
  InHost([](Session& session) {
    EXPECT_EQ(session.Module().FindDomain("oneDom"), 1u);
    EXPECT_EQ(session.Module().FindDomain("twoDom"), std::nullopt);
  });
}

TEST_F(SessionTest, RefusalOnRequestIsTracedAsTheRefusalThatItStandsFor) {
  Assembled();
  InChild([&] {
    std::vector<std::string> lines;
    const SessionOptions options{.visible = {},
                                 .trace = [&](const std::string& line) { lines.push_back(line); },
                                 .faults = {{.operation = Operation::kFindDomain, .call = 2}}};
    Enter(options, [&](Session& session) {
      session.Module().FindDomain("netDom");
      EXPECT_THROW(session.Module().FindDomain("netDom"), ModuleError);
    });
    EXPECT_THAT(lines, ElementsAre("find-domain netDom",
                                   "find-domain netDom ! refused on request: find-domain, call 2"));
  });
}

TEST_F(SessionTest, LeakedDomainsAreFoundInsideTheHost) {
  Assembled();
  InHost([](Session& session) {
    session.Module().CreateDomain("ownDom", DomainOrigin::kRunTime);
    EXPECT_THAT(session.Module().LeakedDomains(), ElementsAre());
  });
  InHost([](Session& session) { EXPECT_THAT(session.Module().LeakedDomains(), ElementsAre(1u)); });
}

}  // namespace
}  // namespace StandIn
