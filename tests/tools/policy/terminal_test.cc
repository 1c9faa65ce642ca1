// Colours, and what a terminal is not to be sent.
#include "tools/policy/terminal.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>

namespace SecPolicyTool {
namespace {

// The other end of a terminal of one's own.
class TerminalTest : public testing::Test {
 protected:
  void SetUp() override {
    master_ = posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_GE(master_, 0);
    ASSERT_EQ(grantpt(master_), 0);
    ASSERT_EQ(unlockpt(master_), 0);
    terminal_ = open(ptsname(master_), O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_GE(terminal_, 0);
    setenv("TERM", "xterm", 1);
    unsetenv("NO_COLOR");
  }
  void TearDown() override {
    unsetenv("NO_COLOR");
    close(terminal_);
    close(master_);
  }

  int master_ = -1;
  int terminal_ = -1;
};

TEST_F(TerminalTest, TerminalIsColoured) { EXPECT_TRUE(WantsColour(terminal_)); }

TEST_F(TerminalTest, NoColorTurnsItOff) {
  setenv("NO_COLOR", "1", 1);
  EXPECT_FALSE(WantsColour(terminal_));
  setenv("NO_COLOR", "", 1);
  EXPECT_TRUE(WantsColour(terminal_));
}

TEST_F(TerminalTest, DumbTerminalIsNotColoured) {
  setenv("TERM", "dumb", 1);
  EXPECT_FALSE(WantsColour(terminal_));
}

TEST_F(TerminalTest, FileIsNotColoured) {
  const int file = open("/dev/null", O_WRONLY | O_CLOEXEC);
  EXPECT_FALSE(WantsColour(file));
  close(file);
}

TEST(PainterTest, PaintsOrLeavesAsItIs) {
  EXPECT_EQ(Painter(true).Paint(Colour::kRed, "x"), "\x1b[31mx\x1b[0m");
  EXPECT_EQ(Painter(true).Paint(Colour::kBold, "x"), "\x1b[1mx\x1b[0m");
  EXPECT_EQ(Painter(false).Paint(Colour::kRed, "x"), "x");
}

TEST(PrintableTest, ControlCharactersAreShown) {
  EXPECT_EQ(Printable("a\tb\x1b[0m\x7f\n"), "a\\x09b\\x1b[0m\\x7f\\x0a");
  EXPECT_EQ(Printable("\xC2\x9b\xFF"), "\\xc2\\x9b\\xff");
  EXPECT_EQ(Printable("gr\xC3\xBC\xC3\x9F"), "gr\xC3\xBC\xC3\x9F");
}

}  // namespace
}  // namespace SecPolicyTool
