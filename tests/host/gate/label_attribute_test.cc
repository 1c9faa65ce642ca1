// setxattr and getxattr of the attribute that holds a file's label.
#include <sys/syscall.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>

#include "tests/host/gate/gate_fixture.h"
#include "tests/support/counted_memory.h"

namespace StandIn {
namespace {

using SecPolicyTest::Operation;
using SecPolicyTest::Outcome;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr std::uint32_t kDefault = 1;  // the ids of the predefined labels
constexpr std::uint32_t kTardisk = 2;

std::string Set(const char* path, std::uint32_t label, int flags = XATTR_REPLACE) {
  return ResultText(setxattr(path, kLabel, &label, sizeof label, flags));
}

// The id of the file's label, or the errno's name.
std::string Get(const char* path) {
  std::uint32_t label = 0;
  const ssize_t size = getxattr(path, kLabel, &label, sizeof label);
  return size == sizeof label ? std::to_string(label) : ResultText(size);
}

class LabelAttributeTest : public GateTest {
 protected:
  LabelAttributeTest() {
    Tardisk("base.tar")
        .Directory("etc")
        .File("etc/motd", "hello\n")
        .HardLink("etc/same", "etc/motd")
        .Symlink("etc/link", "motd")
        .Fifo("etc/fifo");
  }
};

TEST_F(LabelAttributeTest, EveryFileOfTheImageCarriesALabelFromTheStart) {
  InHost([] {
    for (const char* path : {"/", "/etc", "/etc/motd", "/etc/link", "/etc/fifo", "/tardisks",
                             "/tardisks/base.tar", "etc/../etc/motd"})
      EXPECT_EQ(Get(path), std::to_string(kDefault)) << path;
  });
}

TEST_F(LabelAttributeTest, OtherAttributeForWhoseNameThereIsNoMemoryIsAnError) {
  InHost([] {
    constexpr char kOther[] = "user.a-name-that-is-longer-than-others";
    SecPolicyTest::FailAllocation(0);
    const int set = setxattr("/etc/motd", kOther, "x", 1, 0);
    const int reason = set == 0 ? 0 : errno;
    SecPolicyTest::FailAllocation(0);
    const ssize_t got = getxattr("/etc/motd", kOther, nullptr, 0);
    const int otherReason = got >= 0 ? 0 : errno;
    SecPolicyTest::FailNoAllocation();
    EXPECT_EQ(reason, ENOMEM);
    EXPECT_EQ(otherReason, ENOMEM);
  });
}

TEST_F(LabelAttributeTest, LabelIsKept) {
  InHost([] { EXPECT_EQ(Set("/etc/motd", kTardisk), "0"); });
  InHost([] {
    EXPECT_EQ(Get("/etc/motd"), "2");
    EXPECT_EQ(Get("/etc/fifo"), "1");
  });
}

TEST_F(LabelAttributeTest, LinksLeadToOneLabel) {
  InHost([] {
    EXPECT_EQ(Set("/etc/link", kTardisk), "0");
    for (const char* path : {"/etc/motd", "/etc/same", "/etc/link"}) {
      EXPECT_EQ(Get(path), "2") << path;
    }
    EXPECT_EQ(Set("/etc/same", kDefault), "0");
    EXPECT_EQ(Get("/etc/motd"), "1");
  });
}

TEST_F(LabelAttributeTest, IsAnOperationWithThePathInTheImage) {
  Fail(Operation::kSetFileLabel, 2, EROFS);
  const Outcome outcome = Run([] {
    return InTurn({Set("/etc/link", kTardisk), Set("/etc/motd", 77), Get("/etc/../etc/motd")});
  });
  EXPECT_EQ(outcome.value, "0, EROFS, 2");
  EXPECT_THAT(
      outcome.Operations(),
      ElementsAre("set-file-label /etc/motd tardisk",
                  "set-file-label /etc/motd #77 ! refused on request: set-file-label, call 2",
                  "get-file-label /etc/motd"));
}

TEST_F(LabelAttributeTest, FlagsAreThoseOfAFileThatCarriesTheAttribute) {
  struct Row {
    int flags;
    const char* result;
  };
  InHost([] {
    for (const Row& row : {Row{0, "0"}, Row{XATTR_REPLACE, "0"}, Row{XATTR_CREATE, "EEXIST"},
                           Row{4, "EINVAL"}, Row{4 | XATTR_REPLACE, "EINVAL"}, Row{-1, "EINVAL"}})
      EXPECT_EQ(Set("/etc/motd", kTardisk, row.flags), row.result) << row.flags;
  });
}

TEST_F(LabelAttributeTest, ValueIsFourBytes) {
  InHost([] {
    const std::uint64_t value = kTardisk;
    for (const std::size_t size : {0U, 1U, 3U, 5U, 8U}) {
      EXPECT_EQ(ResultText(setxattr("/etc/motd", kLabel, &value, size, 0)), "EINVAL") << size;
    }
    EXPECT_EQ(Get("/etc/motd"), "1");
  });
}

TEST_F(LabelAttributeTest, UnknownLabelIsRefused) {
  InHost([] {
    EXPECT_EQ(Set("/etc/motd", 0), "EINVAL");
    EXPECT_EQ(Set("/etc/motd", 3), "EINVAL");
    EXPECT_EQ(Get("/etc/motd"), "1");
  });
}

TEST_F(LabelAttributeTest, SizeCanBeAskedForAndMustFit) {
  InHost([] {
    char value[8] = "xxxxxxx";
    EXPECT_EQ(ResultText(getxattr("/etc/motd", kLabel, nullptr, 0)), "4");
    EXPECT_EQ(ResultText(getxattr("/etc/motd", kLabel, value, 3)), "ERANGE");
    EXPECT_EQ(value[0], 'x');
    EXPECT_EQ(ResultText(getxattr("/etc/motd", kLabel, value, 8)), "4");
    EXPECT_EQ(value[4], 'x');
  });
}

TEST_F(LabelAttributeTest, FileThatNoArchiveBroughtCarriesNone) {
  Assemble();
  WriteBytes(InRoot("/etc/new"), "not from an archive");
  const Outcome outcome = Run([&] {
    const char* path = "/etc/new";
    return InTurn({Get(path), Set(path, kTardisk), Set(path, kTardisk, 0),
                   Set(path, kTardisk, XATTR_CREATE)});
  });
  EXPECT_EQ(outcome.value, "ENODATA, ENODATA, EOPNOTSUPP, EOPNOTSUPP");
  EXPECT_THAT(outcome.Operations(), IsEmpty());
}

// Otherwise a label on a tree would fail only because the policy that is being tried lies in it.
TEST_F(LabelAttributeTest, WhatIsMadeVisibleCarriesTheLabel) {
  Policy("objects/base", "default\n");
  const std::string file = PolicyPath("objects/base");
  const Outcome outcome = Run([&] {
    return InTurn({Get(file.c_str()), Set(file.c_str(), kTardisk), Get(file.c_str()),
                   Set(PolicyDir().c_str(), kTardisk)});
  });
  EXPECT_EQ(outcome.value, "1, 0, 2, 0");
}

TEST_F(LabelAttributeTest, DirectoryThatNoArchiveBroughtCarriesTheLabel) {
  Assemble();
  std::filesystem::create_directories(InRoot("/srv/mount-point"));
  const Outcome outcome = Run([] {
    return InTurn({Get("/srv/mount-point"), Set("/srv/mount-point", kTardisk)});
  });
  EXPECT_EQ(outcome.value, "1, 0");
}

TEST_F(LabelAttributeTest, PathThatLeadsNowhereIsAnError) {
  InHost([] {
    EXPECT_EQ(Get("/etc/none"), "ENOENT");
    EXPECT_EQ(Set("/etc/none", kTardisk), "ENOENT");
    EXPECT_EQ(Set("/etc/motd/none", kTardisk), "ENOTDIR");
    EXPECT_EQ(Get(""), "ENOENT");
    EXPECT_EQ(Get(std::string(5000, '/').c_str()), "ENAMETOOLONG");
  });
}

TEST_F(LabelAttributeTest, BadAddressesAreErrorsAndTheLabelStays) {
  InHost([] {
    LastPage page;
    // Made directly: a sanitizer would read the arguments before the C library's function does.
    const auto set = [](const char* path, const void* value) {
      return ResultText(syscall(SYS_setxattr, path, kLabel, value, 4UL, XATTR_REPLACE));
    };
    const auto get = [](const char* path, void* value) {
      return ResultText(syscall(SYS_getxattr, path, kLabel, value, 4UL));
    };
    char* cell = page.PutAtEnd(std::string("\2\0\0\0", 4));
    EXPECT_EQ(set(nullptr, cell), "EFAULT");
    EXPECT_EQ(set(page.End(), cell), "EFAULT");
    EXPECT_EQ(set("/etc/motd", nullptr), "EFAULT");
    EXPECT_EQ(set("/etc/motd", cell + 1), "EFAULT");
    EXPECT_EQ(get(nullptr, cell), "EFAULT");
    EXPECT_EQ(get("/etc/motd", nullptr), "EFAULT");
    EXPECT_EQ(get("/etc/motd", page.End() - 3), "EFAULT");
    *cell = kTardisk;  // as far as memory goes, it may have been written
    std::memset(cell + 1, 0, 3);
    page.MakeReadOnly();
    EXPECT_EQ(get("/etc/motd", cell), "EFAULT");
    EXPECT_EQ(Get("/etc/motd"), "1");
    EXPECT_EQ(set("/etc/motd", cell), "0");  // it may be read
    EXPECT_EQ(Get("/etc/motd"), "2");
  });
}

TEST_F(LabelAttributeTest, NameAndPathMayEndWhereMemoryEnds) {
  InHost([] {
    LastPage path;
    LastPage name;
    std::uint32_t label = 0;
    EXPECT_EQ(getxattr(path.PutAtEnd({"/etc/motd\0", 10}), name.PutAtEnd({"olvane.security\0", 16}),
                       &label, sizeof label),
              4);
  });
}

// However much of a path is copied at a time.
TEST_F(LabelAttributeTest, PathMayBeOfAnyLengthThatAKernelTakes) {
  InHost([] {
    for (const std::size_t length : {254U, 255U, 256U, 257U, 1278U, 1280U, 1282U, 4095U}) {
      std::string path(length, '/');
      path.replace(0, 4, "/etc").replace(length - 4, 4, "motd");
      const std::uint32_t label = 2 - length % 2;
      EXPECT_EQ(ResultText(setxattr(path.c_str(), kLabel, &label, sizeof label, XATTR_REPLACE)),
                "0")
          << length;
      EXPECT_EQ(Get("/etc/motd"), std::to_string(label)) << length;
    }
    const std::string tooLong = "/etc" + std::string(4088, '/') + "motd";
    EXPECT_EQ(ResultText(getxattr(tooLong.c_str(), kLabel, nullptr, 0)), "ENAMETOOLONG");
  });
}

TEST_F(LabelAttributeTest, WithoutAHostTheKernelKnowsNoSuchAttribute) {
  Assemble();
  BehindTheGate([&] {
    EXPECT_EQ(Get(InRoot("/etc/motd").c_str()), "EOPNOTSUPP");
    EXPECT_EQ(Set(InRoot("/etc/motd").c_str(), kTardisk), "EOPNOTSUPP");
  });
}

}  // namespace
}  // namespace StandIn
