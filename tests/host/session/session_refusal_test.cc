// Hosts that cannot be entered.
#include <seccomp.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "host/session/change_root.h"
#include "tests/host/session/session_fixture.h"

namespace StandIn {
namespace {

class SessionRefusalTest : public SessionTest {
 protected:
  // Expects the refusal, and that the host is as it was before.
  void ExpectRefusalAndNoChange(const testing::Matcher<std::string>& error) const {
    const auto before = Snapshot();
    InChild([&] { ExpectRefusal(error); });
    EXPECT_EQ(Snapshot(), before);
  }
};

TEST_F(SessionRefusalTest, HostThatHasNotBeenAssembled) {
  ExpectRefusalAndNoChange(
      Path() + " has not been assembled; do it with \"secpolicy host assemble " + Path() + "\"");
}

TEST_F(SessionRefusalTest, MissingDirectory) {
  EXPECT_EQ(MessageOf<HostError>([&] { HostDirectory(Path() + "/none/"); }),
            Path() +
                "/none: cannot be opened: No such file or directory; make one with "
                "\"secpolicy host init " +
                Path() + "/none\"");
}

TEST_F(SessionRefusalTest, DamagedFiles) {
  Assembled();
  for (const char* name : {"host.json", "image.json", "kernel.json"}) {
    const std::string whole = Exists(name) ? ReadBytes(Path(name)) : "";
    WriteBytes(Path(name), "{\"format\": 1,\n \"limits\": }");
    ExpectRefusalAndNoChange(testing::StartsWith(Path(name) + ":2:12: "));
    WriteBytes(Path(name), whole);
  }
}

TEST_F(SessionRefusalTest, DescriptionWithAnUnknownMember) {
  Assembled();
  WriteBytes(Path("host.json"), "{\"format\": 1, \"limit\": {}}");
  ExpectRefusalAndNoChange(Path("host.json") + ": /limit: unknown member");
}

TEST_F(SessionRefusalTest, IndexOfAnotherShape) {
  Assembled();
  WriteBytes(Path("image.json"), "{}");
  ExpectRefusalAndNoChange(Path("image.json") + ": /: lacks the member \"tardisks\"");
}

TEST_F(SessionRefusalTest, StateOfAnotherShape) {
  Assembled();
  WriteBytes(Path("kernel.json"), "{}");
  ExpectRefusalAndNoChange(Path("kernel.json") + ": /: lacks the member \"format\"");
}

TEST_F(SessionRefusalTest, StateThatIsNoFile) {
  Assembled();
  std::filesystem::create_directory(Path("kernel.json"));
  ExpectRefusalAndNoChange(Path("kernel.json") + ": not a regular file");
}

TEST_F(SessionRefusalTest, MissingRoot) {
  Assembled();
  std::filesystem::remove_all(Path("root"));
  ExpectRefusalAndNoChange(Path("root") + ": cannot be opened: No such file or directory");
}

TEST_F(SessionRefusalTest, RootThatIsALink) {
  Assembled();
  std::filesystem::remove_all(Path("root"));
  std::filesystem::create_directory_symlink("/", Path("root"));
  ExpectRefusalAndNoChange(Path("root") + ": cannot be opened: Not a directory");
}

SessionOptions Showing(const std::string& directory) {
  return {.visible = {directory}, .trace = {}, .faults = {}};
}

TEST_F(SessionRefusalTest, VisibleDirectoryThatIsNotThere) {
  Assembled();
  InChild([&] {
    ExpectRefusal(Path("none") + ": cannot be made visible in the host: No such file or directory",
                  Showing(Path("none")));
  });
}

TEST_F(SessionRefusalTest, VisibleDirectoryWhereTheImageHasAFile) {
  const std::string above = std::filesystem::path(Visible()).parent_path();
  Tardisk("base.tar", Archive().File(above.substr(1), "a file"));
  Assembled();
  InChild([&] {
    EXPECT_EQ(MessageOf<HostError>([&] { Enter(Showing(Visible()), [](Session&) {}); }),
              Visible() + ": cannot be made in the host's root: Not a directory");
  });
}

// As in a plain chroot.
TEST_F(SessionRefusalTest, VisibleDirectoryForAProcessWhoseRootIsNoMountPoint) {
  Assembled();
  const std::filesystem::path host = Path();
  InChild([&] {
    if (geteuid() != 0) {
      ASSERT_EQ(unshare(CLONE_NEWUSER), 0);
    }
    ASSERT_EQ(chroot(host.parent_path().c_str()), 0);
    ASSERT_EQ(chdir("/"), 0);
    const HostDirectory inChroot("/" + host.filename().string());
    EXPECT_EQ(MessageOf<HostError>([&] { ChangeRoot(inChroot.Ref(), {"/policy"}); }),
              "the host cannot be entered: a directory outside it is to be visible in it, and the "
              "root directory of this process is no mount point, as in a plain chroot; \"mount "
              "--bind DIR DIR\" before \"chroot DIR\" makes it one");
  });
  EXPECT_FALSE(Exists("root/policy"));
}

// Has the kernel refuse to make namespaces, as it does where they are switched off.
void RefuseNamespaces(unsigned int error) {
  scmp_filter_ctx filter = seccomp_init(SCMP_ACT_ALLOW);
  ASSERT_EQ(seccomp_rule_add(filter, SCMP_ACT_ERRNO(error), SCMP_SYS(unshare), 0), 0);
  ASSERT_EQ(seccomp_load(filter), 0);
  seccomp_release(filter);
}

std::string NamespacesMissing(const std::string& call) {
  return "the host cannot be entered: " + call +
         "; this needs either root's rights to mount and to change root (CAP_SYS_ADMIN, "
         "CAP_SYS_CHROOT) or user namespaces for ordinary users (the settings "
         "user.max_user_namespaces and, where there is one, kernel.unprivileged_userns_clone)";
}

TEST_F(SessionRefusalTest, NoMountsAndNoUserNamespaces) {
  Assembled();
  for (const int error : {EPERM, ENOSPC}) {
    InChild([&] {
      RefuseNamespaces(static_cast<unsigned int>(error));
      ExpectRefusal(NamespacesMissing(std::string("unshare: ") + std::strerror(error)),
                    Showing(Visible()));
    });
  }
  EXPECT_FALSE(Exists("root" + Visible()));
}

TEST_F(SessionRefusalTest, NoChangeOfRootAndNoUserNamespaces) {
  AsOrdinaryUser([&] {
    Assembled();
    RefuseNamespaces(ENOSPC);
    ExpectRefusal(NamespacesMissing("unshare: No space left on device"));
  });
}

TEST_F(SessionRefusalTest, UserNamespaceThatCannotBeSetUp) {
  AsOrdinaryUser([&] {
    Assembled();
    prctl(PR_SET_DUMPABLE, 0);  // its files below /proc are root's
    ExpectRefusal(NamespacesMissing("/proc/self/setgroups: Permission denied"));
  });
}

TEST_F(SessionRefusalTest, StateThatMayNotBeRead) {
  AsOrdinaryUser([&] {
    Assembled();
    WriteBytes(Path("kernel.json"), "{}");
    std::filesystem::permissions(Path("kernel.json"), std::filesystem::perms(0));
    ExpectRefusal(Path("kernel.json") + ": cannot be opened: Permission denied");
  });
}

}  // namespace
}  // namespace StandIn
