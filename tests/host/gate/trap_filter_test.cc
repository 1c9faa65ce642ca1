// The filter's program, judged as the kernel judges it.
#include "host/gate/trap_filter.h"

#include <dlfcn.h>
#include <gtest/gtest.h>
#include <linux/audit.h>
#include <linux/seccomp.h>
#include <sys/syscall.h>

#include <algorithm>
#include <cstring>
#include <memory>

namespace StandIn {
namespace {

#if defined(__x86_64__)
constexpr std::uint32_t kNative = AUDIT_ARCH_X86_64;
constexpr std::uint32_t kOther = AUDIT_ARCH_I386;
#else
constexpr std::uint32_t kNative = AUDIT_ARCH_AARCH64;
constexpr std::uint32_t kOther = AUDIT_ARCH_ARM;
#endif

// The kernel's machine, as far as this program uses it.
std::uint32_t Verdict(const std::vector<sock_filter>& program, const seccomp_data& data) {
  std::uint32_t word = 0;
  for (std::size_t at = 0; at < program.size(); ++at) {
    const sock_filter& step = program[at];
    const auto skip = [&](bool condition) { at += condition ? step.jt : step.jf; };
    switch (step.code) {
      case BPF_LD | BPF_W | BPF_ABS:
        std::memcpy(&word, reinterpret_cast<const char*>(&data) + step.k, sizeof word);
        break;
      case BPF_JMP | BPF_JEQ | BPF_K:
        skip(word == step.k);
        break;
      case BPF_JMP | BPF_JGE | BPF_K:
        skip(word >= step.k);
        break;
      case BPF_JMP | BPF_JGT | BPF_K:
        skip(word > step.k);
        break;
      case BPF_RET | BPF_K:
        return step.k;
      default:
        ADD_FAILURE() << "an unknown instruction: " << step.code;
        return 0;
    }
  }
  ADD_FAILURE() << "the program ends without a verdict";
  return 0;
}

constexpr std::uint64_t kPassThrough = 0x401234;
// The second range crosses a multiple of 2^32, the third spans a whole one.
const std::vector<CodeRange> kOwnCode = {
    {0x401000, 0x402000}, {0x5'ffff'f000, 0x6'0000'1000}, {0x7f01'ffff'ff00, 0x7f03'0000'0100}};

struct FilterRow {
  const char* what;
  long number;
  std::uint64_t place;
  bool trapped;
  std::uint64_t argument = 0;
  std::uint32_t architecture = kNative;
};

void ExpectVerdicts(const std::vector<FilterRow>& rows) {
  const std::vector<sock_filter> program = BuildTrapFilter(kOwnCode, kPassThrough);
  for (const FilterRow& row : rows) {
    seccomp_data data{};
    data.nr = static_cast<int>(row.number);
    data.arch = row.architecture;
    data.instruction_pointer = row.place;
    data.args[0] = row.argument;
    const std::uint32_t expected = row.trapped ? SECCOMP_RET_TRAP : SECCOMP_RET_ALLOW;
    EXPECT_EQ(Verdict(program, data), expected)
        << row.what << ": call " << row.number << " from " << std::hex << row.place;
  }
}

TEST(TrapFilterTest, PrivateCallsAreTrappedWhereverTheyComeFrom) {
  ExpectVerdicts({{"below the numbers", 16473, 0x401000, false},
                  {"first number", 16474, 0x401000, true},
                  {"number without a name", 16482, 0x401000, true},
                  {"last number", 16488, 0x401000, true},
                  {"above the numbers", 16489, 0x401000, false},
                  {"foreign code", 16480, 0x9'0000'0000, true}});
}

TEST(TrapFilterTest, PathOptionIsTrappedWhereverItComesFrom) {
  ExpectVerdicts({{"path option", SYS_prctl, 0x401000, true, 4109},
                  {"foreign code", SYS_prctl, 0x9'0000'0000, true, 4109},
                  {"option below", SYS_prctl, 0x401000, false, 4108},
                  {"option above", SYS_prctl, 0x401000, false, 4110},
                  // The option is an int: the kernel does not look at the upper half.
                  {"upper half set", SYS_prctl, 0x401000, true, 0xffff'ffff'0000'100d},
                  {"another call", SYS_getpid, 0x401000, false, 4109}});
}

TEST(TrapFilterTest, AttributeCallsAreTrappedFromOwnCode) {
  for (const long number : {SYS_setxattr, SYS_getxattr}) {
    ExpectVerdicts({{"before a range", number, 0x400fff, false},
                    {"start of a range", number, 0x401000, true},
                    {"end of a range", number, 0x401fff, true},
                    {"behind a range", number, 0x402000, false},
                    {"same lower half elsewhere", number, 0x1'0040'1000, false}});
  }
}

TEST(TrapFilterTest, RangesMayCrossMultiplesOf2To32) {
  ExpectVerdicts({{"before", SYS_getxattr, 0x5'ffff'efff, false},
                  {"start", SYS_getxattr, 0x5'ffff'f000, true},
                  {"below the multiple", SYS_getxattr, 0x5'ffff'ffff, true},
                  {"the multiple", SYS_getxattr, 0x6'0000'0000, true},
                  {"end", SYS_getxattr, 0x6'0000'0fff, true},
                  {"behind", SYS_getxattr, 0x6'0000'1000, false},
                  {"start of the long one", SYS_getxattr, 0x7f01'ffff'ff00, true},
                  {"within the long one", SYS_getxattr, 0x7f02'1234'5678, true},
                  {"end of the long one", SYS_getxattr, 0x7f03'0000'00ff, true},
                  {"behind the long one", SYS_getxattr, 0x7f03'0000'0100, false}});
}

TEST(TrapFilterTest, StubsCallsAreLetBy) {
  ExpectVerdicts({{"attribute", SYS_getxattr, kPassThrough, false},
                  {"private call", 16474, kPassThrough, false},
                  {"path option", SYS_prctl, kPassThrough, false, 4109},
                  {"one byte before", 16474, kPassThrough - 1, true},
                  {"one byte behind", 16474, kPassThrough + 1, true},
                  {"same lower half elsewhere", 16474, kPassThrough + 0x1'0000'0000, true}});
}

TEST(TrapFilterTest, OtherCallsAndOtherArchitecturesAreLetBy) {
  ExpectVerdicts({{"attribute of a descriptor", SYS_fgetxattr, 0x401000, false},
                  {"attribute of a link", SYS_lsetxattr, 0x401000, false},
                  {"read", SYS_read, 0x401000, false},
                  {"other architecture", 16474, 0x401000, false, 0, kOther},
                  {"other architecture", SYS_getxattr, 0x401000, false, 0, kOther}});
}

TEST(TrapFilterTest, FilterWithoutOwnCodeStillTrapsPrivateCalls) {
  const auto program = BuildTrapFilter({}, kPassThrough);
  seccomp_data data{};
  data.arch = kNative;
  data.nr = 16474;
  EXPECT_EQ(Verdict(program, data), SECCOMP_RET_TRAP);
  data.nr = SYS_getxattr;
  EXPECT_EQ(Verdict(program, data), SECCOMP_RET_ALLOW);
}

bool IsOwnCode(const void* address) {
  const std::vector<CodeRange> ranges = OwnCode();
  const auto place = reinterpret_cast<std::uint64_t>(address);
  return std::any_of(ranges.begin(), ranges.end(), [place](const CodeRange& range) {
    return range.begin <= place && place < range.end;
  });
}

TEST(OwnCodeTest, IsTheCodeOfTheProgramAndOfItsLibraries) {
  EXPECT_TRUE(IsOwnCode(reinterpret_cast<const void*>(&BuildTrapFilter)));
  EXPECT_TRUE(IsOwnCode(dlsym(RTLD_DEFAULT, "setxattr")));
}

TEST(OwnCodeTest, IsNotData) {
  static int global = 0;
  const auto onTheHeap = std::make_unique<int>(0);
  EXPECT_FALSE(IsOwnCode(&global));
  EXPECT_FALSE(IsOwnCode(onTheHeap.get()));
  EXPECT_FALSE(IsOwnCode(nullptr));
}

}  // namespace
}  // namespace StandIn
