// What the gate leaves to the kernel.
#include <sys/mman.h>
#include <sys/syscall.h>
#include <sys/xattr.h>
#include <unistd.h>

#include "host/gate/passthrough.h"
#include "tests/host/gate/gate_fixture.h"

namespace StandIn {
namespace {

class PassThroughTest : public GateTest {
 protected:
  PassThroughTest() { Tardisk("base.tar").File("motd", "hello\n"); }

  void SetUp() override {
    Assemble();
    if (setxattr(Motd().c_str(), "user.probe", "", 0, 0) != 0) {
      GTEST_SKIP() << "this file system has no attributes of users: " << std::strerror(errno);
    }
  }

  // The file as it is outside.
  [[nodiscard]] std::string Motd() const { return InRoot("/motd"); }
};

TEST_F(PassThroughTest, OtherAttributesAreStoredOnTheFile) {
  InHost([] {
    EXPECT_EQ(ResultText(setxattr("/motd", "user.note", "text", 4, XATTR_CREATE)), "0");
    EXPECT_EQ(ResultText(setxattr("/motd", "user.note", "text", 4, XATTR_CREATE)), "EEXIST");
    EXPECT_EQ(ResultText(setxattr("/motd", "user.none", "text", 4, XATTR_REPLACE)), "ENODATA");
  });
  char value[8] = {};
  EXPECT_EQ(getxattr(Motd().c_str(), "user.note", value, sizeof value), 4);
  EXPECT_STREQ(value, "text");
}

TEST_F(PassThroughTest, OtherAttributesAreReadFromTheFile) {
  ASSERT_EQ(setxattr(Motd().c_str(), "user.note", "text", 4, 0), 0);
  InHost([] {
    char value[8] = {};
    EXPECT_EQ(ResultText(getxattr("/motd", "user.note", value, sizeof value)), "4");
    EXPECT_STREQ(value, "text");
    EXPECT_EQ(ResultText(getxattr("/motd", "user.note", value, 3)), "ERANGE");
    EXPECT_EQ(ResultText(getxattr("/motd", "user.note", nullptr, 0)), "4");
    EXPECT_EQ(ResultText(getxattr("/motd", "user.none", value, sizeof value)), "ENODATA");
    EXPECT_EQ(ResultText(getxattr("/none", "user.note", value, sizeof value)), "ENOENT");
  });
}

TEST_F(PassThroughTest, NameThatIsAlmostTheLabelsIsTheKernels) {
  InHost([] {
    char value[8] = {};
    for (const char* name : {"olvane.securit", "olvane.security2", "Olvane.security", "olvane."}) {
      EXPECT_EQ(ResultText(getxattr("/motd", name, value, 4)), "EOPNOTSUPP") << name;
      EXPECT_EQ(ResultText(setxattr("/motd", name, value, 4, 0)), "EOPNOTSUPP") << name;
    }
  });
}

TEST_F(PassThroughTest, NameThatCannotBeReadIsTheKernelsToRefuse) {
  InHost([] {
    LastPage page;
    char value[8] = {};
    const std::string tooLong(256, 'n');
    // Made directly: a sanitizer would read the name before the C library's function does.
    const auto call = [&](long number, const char* name) {
      return ResultText(syscall(number, "/motd", name, value, 4UL, 0UL));
    };
    EXPECT_EQ(call(SYS_getxattr, page.PutAtEnd("olvane.security")), "EFAULT");
    EXPECT_EQ(call(SYS_setxattr, page.End()), "EFAULT");
    EXPECT_EQ(call(SYS_getxattr, tooLong.c_str()), "ERANGE");
    EXPECT_EQ(call(SYS_setxattr, ""), "ERANGE");
  });
}

TEST_F(PassThroughTest, StubAsksTheKernel) {
  InHost([] {
    std::uint32_t label = 0;
    ASSERT_EQ(getxattr("/motd", kLabel, &label, sizeof label), 4);
    const std::uint64_t arguments[6] = {reinterpret_cast<std::uint64_t>("/motd"),
                                        reinterpret_cast<std::uint64_t>(kLabel),
                                        reinterpret_cast<std::uint64_t>(&label), sizeof label};
    EXPECT_EQ(SecpolicyGatePassThrough(SYS_getxattr, arguments), -EOPNOTSUPP);
    EXPECT_EQ(SecpolicyGatePassThrough(16479, arguments), -ENOSYS);
  });
}

// The stub's code once more, where no code was when the gate was entered.
class ForeignCode {
 public:
  ForeignCode() {
    const char* code = reinterpret_cast<const char*>(&SecpolicyGatePassThrough);
    constexpr std::size_t kReturnBytes = 4;
    const auto size =
        static_cast<std::size_t>(kSecpolicyGatePassThroughReturn - code) + kReturnBytes;
    std::memcpy(page_.Begin(), code, size);
    mprotect(page_.Begin(), LastPage::kSize, PROT_READ | PROT_EXEC);
    __builtin___clear_cache(page_.Begin(), page_.Begin() + size);
  }

  long Call(long number, const std::uint64_t* arguments) const {
    return reinterpret_cast<decltype(&SecpolicyGatePassThrough)>(page_.Begin())(number, arguments);
  }

 private:
  LastPage page_;
};

TEST_F(PassThroughTest, AttributeCallsOfForeignCodeAreTheKernels) {
  InHost([] {
    const ForeignCode foreign;
    std::uint32_t label = 0;
    const std::uint64_t arguments[6] = {reinterpret_cast<std::uint64_t>("/motd"),
                                        reinterpret_cast<std::uint64_t>(kLabel),
                                        reinterpret_cast<std::uint64_t>(&label), sizeof label};
    EXPECT_EQ(foreign.Call(SYS_getxattr, arguments), -EOPNOTSUPP);
    EXPECT_EQ(foreign.Call(SYS_setxattr, arguments), -EOPNOTSUPP);
  });
}

TEST_F(PassThroughTest, PrivateCallsOfForeignCodeAreTheModules) {
  InHost([] {
    const ForeignCode foreign;
    std::uint32_t count = 99;
    const std::uint64_t arguments[6] = {0, reinterpret_cast<std::uint64_t>(&count)};
    EXPECT_EQ(foreign.Call(16479, arguments), 0);
    EXPECT_EQ(count, 0u);
  });
}

}  // namespace
}  // namespace StandIn
