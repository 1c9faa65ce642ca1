// Colours, and what a terminal is not to be sent.
#include "tools/policy/terminal.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>
#include <iostream>
#include <sstream>

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

TEST(TerminalTextTest, EveryStringIsEscapedOnTheWay) {
  const TerminalText text =
      Painter(true).Paint(Colour::kRed, "a\x1b[2J") + "\n" + std::string("b\r");
  EXPECT_EQ(text, "\x1b[31ma\\x1b[2J\x1b[0m\\x0ab\\x0d");
  EXPECT_EQ(TerminalText("a").EndLine(), "a\n");
}

// What a stream hands on that is, or is not, a terminal.
class OutputTest : public testing::Test {
 protected:
  void SetUp() override { before_ = std::cout.rdbuf(sent_.rdbuf()); }
  void TearDown() override { std::cout.rdbuf(before_); }
  std::string Sent() {
    std::string sent = sent_.str();
    sent_.str("");
    return sent;
  }

 private:
  std::ostringstream sent_;
  std::streambuf* before_ = nullptr;
};

TEST_F(OutputTest, TerminalIsSentEscapedBytesAndLineEnds) {
  const TerminalOutput output(true, false);
  std::cout << "a\x1b[2J\tb\n\xC3\xBC\xE2\x80\xAE" << std::flush;
  EXPECT_EQ(Sent(), "a\\x1b[2J\\x09b\n\xC3\xBC\\xe2\\x80\\xae");
}

TEST_F(OutputTest, PipeIsSentTheBytes) {
  const TerminalOutput output(false, false);
  std::cout << "a\x1b[2J\tb\n\xC3\xBC\xE2\x80\xAE" << std::flush;
  EXPECT_EQ(Sent(), "a\x1b[2J\tb\n\xC3\xBC\xE2\x80\xAE");
  PrintLine(std::cout, "a\nb");
  EXPECT_EQ(Sent(), "a\nb\n");
}

TEST_F(OutputTest, TextThatIsEscapedByTypeKeepsItsColours) {
  const TerminalOutput output(true, false);
  std::cout << "<" << Painter(true).Paint(Colour::kRed, "a\x1b") << ">"
            << TerminalText::EraseLine();
  EXPECT_EQ(Sent(), "<\x1b[31ma\\x1b\x1b[0m>\r\x1b[K");
}

TEST_F(OutputTest, CharacterMayComeInPieces) {
  const TerminalOutput output(true, false);
  std::cout << '\xE2' << '\x82' << '\xAC' << std::flush;
  EXPECT_EQ(Sent(), "\xE2\x82\xAC");
  std::cout << '\xC2' << '\x9B' << std::flush;
  EXPECT_EQ(Sent(), "\\xc2\\x9b");
  std::cout << "\xE2" << std::flush;
  EXPECT_EQ(Sent(), "\\xe2");
  std::cout << "\xE2" << TerminalText("x") << "\xC3"
            << "A" << std::flush;
  EXPECT_EQ(Sent(), "\\xe2x\\xc3A");
}

TEST_F(OutputTest, LineOnATerminalIsOneLine) {
  const TerminalOutput output(true, false);
  PrintLine(std::cout, "Error: a\nError: b");
  EXPECT_EQ(Sent(), "Error: a\\x0aError: b\n");
}

TEST_F(OutputTest, StreamIsGivenBack) {
  { const TerminalOutput output(true, true); }
  std::cout << "\x1b";
  EXPECT_EQ(Sent(), "\x1b");
}

TEST_F(OutputTest, FullDiskIsSeen) {
  class Full : public std::streambuf {};
  Full full;
  std::streambuf* before = std::cout.rdbuf(&full);
  {
    const TerminalOutput output(true, false);
    std::cout << TerminalText("x");
    EXPECT_TRUE(std::cout.bad());
    std::cout.clear();
    std::cout << "x";
    EXPECT_TRUE(std::cout.bad());
  }
  std::cout.rdbuf(before);
  std::cout.clear();
}

}  // namespace
}  // namespace SecPolicyTool
