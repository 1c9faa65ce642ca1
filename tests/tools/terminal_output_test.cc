// What the command sends to a terminal, and what to a pipe, when names and policies hold bytes that
// a terminal would obey.
#include <fcntl.h>
#include <termios.h>
#include <unistd.h>

#include <array>
#include <cstdlib>
#include <filesystem>
#include <regex>
#include <stdexcept>

#include "host/files/unique_fd.h"
#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

namespace fs = std::filesystem;
using StandIn::Archive;
using StandIn::UniqueFd;
using testing::HasSubstr;
using testing::Not;

// A window's title, a C1 control, a right-to-left override and an isolate.
constexpr char kEvil[] = "x\x1b]0;t\x07\xC2\x9B\xE2\x80\xAE\xE2\x81\xA6y";
constexpr char kEvilShown[] = "x\\x1b]0;t\\x07\\xc2\\x9b\\xe2\\x80\\xae\\xe2\\x81\\xa6y";

// A terminal that hands on every byte as it gets it.
class Terminal {
 public:
  Terminal() : master_(posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC)) {
    if (grantpt(master_.Get()) != 0 || unlockpt(master_.Get()) != 0) {
      throw std::runtime_error("no terminal can be made");
    }
    slave_ = UniqueFd(open(ptsname(master_.Get()), O_RDWR | O_NOCTTY | O_CLOEXEC));
    termios mode{};
    tcgetattr(slave_.Get(), &mode);
    cfmakeraw(&mode);
    tcsetattr(slave_.Get(), TCSANOW, &mode);
  }

  // In the program that is to write to it.
  void Use() const {
    dup2(slave_.Get(), STDOUT_FILENO);
    dup2(slave_.Get(), STDERR_FILENO);
    setenv("TERM", "xterm", 1);
    setenv("NO_COLOR", "1", 1);
  }

  // What was sent to it, up to "END" which the caller sends.
  std::string Sent() {
    const std::string end = "END";
    if (write(slave_.Get(), end.data(), end.size()) != 3) throw std::runtime_error("write");
    std::string sent;
    std::array<char, 4096> buffer;
    while (!sent.ends_with(end)) {
      const ssize_t size = read(master_.Get(), buffer.data(), buffer.size());
      if (size <= 0) throw std::runtime_error("read");
      sent.append(buffer.data(), static_cast<std::size_t>(size));
    }
    return sent.substr(0, sent.size() - end.size());
  }

 private:
  UniqueFd master_;
  UniqueFd slave_;
};

class TerminalOutputTest : public CommandTest {
 protected:
  // What the command sends to a terminal. A slow machine's progress is not part of it.
  std::string OnTerminal(const Arguments& arguments) {
    Terminal terminal;
    Command(arguments, [&] { terminal.Use(); });
    return std::regex_replace(terminal.Sent(), std::regex("\r\x1b\\[K[^\r\n]*\r\x1b\\[K"), "");
  }

  // Neither of the controls that kEvil has, nor any other.
  static void ExpectHarmless(const std::string& sent) {
    for (const char* control : {"\x1b", "\x07", "\xC2\x9B", "\xE2\x80\xAE", "\xE2\x81\xA6"}) {
      EXPECT_THAT(sent, Not(HasSubstr(control)));
    }
  }

  void MakeEvilPolicy() const {
    Policy(std::string("domains/") + kEvil, "-r /" + std::string(kEvil) + " r\n");
    Policy("objects/names", std::string(kEvil) + "\n");
  }
};

TEST_F(TerminalOutputTest, ShowEscapesWhatAKernelHoldsAndPipesGetTheBytes) {
  MakeHost();
  MakeEvilPolicy();
  ASSERT_EQ(Load().status, 0);
  EXPECT_THAT(Shown(), HasSubstr(kEvil));
  const std::string sent = OnTerminal({"show", "--host", Host()});
  EXPECT_THAT(sent, HasSubstr(kEvilShown));
  ExpectHarmless(sent);
}

TEST_F(TerminalOutputTest, GraphAndPathsAreColoured) {
  MakeHost();
  Policy("objects/names", "prog\n");
  Policy("domains/appDom", "-d prog globalVMDom exec grant\n");
  for (const Arguments& arguments :
       {Arguments{"graph", "--host", Host(), PolicyDir()},
        Arguments{"paths", "--host", Host(), "--policy", PolicyDir(), "appDom", "globalVMDom"},
        Arguments{"diff", "--host", Host(), PolicyDir(), "kernel"}}) {
    Terminal terminal;
    Command(arguments, [&] {
      terminal.Use();
      unsetenv("NO_COLOR");
    });
    const std::string sent = terminal.Sent();
    EXPECT_THAT(sent, HasSubstr("\x1b[1m")) << arguments.front();
    EXPECT_THAT(sent, Not(HasSubstr("\\x1b"))) << arguments.front();
  }
}

TEST_F(TerminalOutputTest, ColoursOfTheCommandStay) {
  MakeHost();
  Policy("domains/appDom", "-s " + std::string(kEvil) + " grant\n");
  Terminal terminal;
  Command({"check", "--host", Host(), PolicyDir()}, [&] {
    terminal.Use();
    unsetenv("NO_COLOR");
  });
  const std::string sent = terminal.Sent();
  EXPECT_THAT(sent, HasSubstr("\x1b[31merror:\x1b[0m "));
  EXPECT_THAT(sent, HasSubstr(kEvilShown));
  EXPECT_THAT(sent, Not(HasSubstr("\x1b]")));
}

TEST_F(TerminalOutputTest, LoadEscapesWordsThatItRejects) {
  MakeHost();
  Policy("domains/appDom", "-s " + std::string(kEvil) + " grant\n");
  EXPECT_THAT(Load().err, HasSubstr(kEvil));
  const std::string sent = OnTerminal({"load", "--trace", "--host", Host(), PolicyDir()});
  EXPECT_THAT(sent, HasSubstr("Error: Error in parsing policy for domain: appDom: 1 : "));
  EXPECT_THAT(sent, HasSubstr(kEvilShown));
  ExpectHarmless(sent);
}

TEST_F(TerminalOutputTest, DigestAndTestEscapeErrorsOfALoad) {
  MakeHost();
  Policy("domains/appDom", "-s " + std::string(kEvil) + " grant\n");
  StandIn::WriteBytes(Path("tests"), "appDom may syscall openat\n");
  EXPECT_THAT(Command({"digest", "--host", Host(), PolicyDir()}).err, HasSubstr(kEvil));
  for (const Arguments& arguments :
       {Arguments{"digest", "--host", Host(), PolicyDir()},
        Arguments{"test", "--host", Host(), "--policy", PolicyDir(), Path("tests")}}) {
    const std::string sent = OnTerminal(arguments);
    EXPECT_THAT(sent, HasSubstr(kEvilShown)) << arguments.front();
    ExpectHarmless(sent);
  }
}

TEST_F(TerminalOutputTest, NamesOfFilesAreEscapedInErrors) {
  MakeHost();
  const std::string file = Path(kEvil);
  EXPECT_THAT(Command({"test", "--host", Host(), file}).err, HasSubstr(kEvil));
  const std::string sent = OnTerminal({"test", "--host", Host(), file});
  EXPECT_THAT(sent, HasSubstr(kEvilShown));
  ExpectHarmless(sent);
}

TEST_F(TerminalOutputTest, HostVerbsEscapeNamesOfArchivesAndDomains) {
  const std::string archive = std::string(kEvil) + "\nError: forged.tar";
  MakeHost({{archive, Archive().File("motd", "")}});
  MakeEvilPolicy();
  ASSERT_EQ(Load().status, 0);
  EXPECT_THAT(Done({"host", "info", Host()}).out, HasSubstr(archive));
  EXPECT_THAT(Done({"host", "assemble", Host()}).out, HasSubstr(archive));
  ASSERT_EQ(Load().status, 0);
  for (const char* verb : {"info", "assemble"}) {
    const std::string sent = OnTerminal({"host", verb, Host()});
    EXPECT_THAT(sent, HasSubstr(std::string(kEvilShown) + "\\x0aError: forged.tar: ")) << verb;
    ExpectHarmless(sent);
  }
}

TEST_F(TerminalOutputTest, DamagedArchiveIsNamedEscaped) {
  Done({"host", "init", Host()});
  StandIn::WriteBytes(Host() + "/tardisks/" + kEvil, "this is no archive");
  EXPECT_THAT(Command({"host", "assemble", Host()}).err, HasSubstr(kEvil));
  const std::string sent = OnTerminal({"host", "assemble", Host()});
  EXPECT_THAT(sent, HasSubstr(kEvilShown));
  ExpectHarmless(sent);
}

// Names within documents and archives are escaped wherever they are told.
TEST_F(TerminalOutputTest, EntriesOfArchivesAreNamedEscapedInPipesToo) {
  Done({"host", "init", Host()});
  StandIn::WriteBytes(Host() + "/tardisks/a.tar",
                      Archive().File("../" + std::string(kEvil), "").Bytes());
  EXPECT_THAT(Command({"host", "assemble", Host()}).err,
              HasSubstr("entry \"../" + std::string(kEvilShown) + "\": "));
}

TEST_F(TerminalOutputTest, MembersOfDocumentsAreNamedEscapedAndWhole) {
  MakeHost();
  const std::string key = "a\\u0000b\\u001b\\u009b\\u202e";
  const std::string shown = "a\\x00b\\x1b\\xc2\\x9b\\xe2\\x80\\xae";
  for (const char* file : {"host.json", "kernel.json", "image.json"}) {
    const std::string path = Host() + "/" + file;
    fs::remove(path + ".kept");
    if (fs::exists(path)) fs::rename(path, path + ".kept");
    StandIn::WriteBytes(path, "{\"format\": 1, \"" + key + "\": 1}");
    EXPECT_THAT(Command({"host", "info", Host()}).err,
                HasSubstr(path + ": /" + shown + ": unknown member\n"));
    StandIn::WriteBytes(path, "{\"" + key + "\": 1, \"" + key + "\": 1}");
    EXPECT_EQ(Command({"host", "info", Host()}).err,
              "Error: " + path + ": gives the member \"" + shown + "\" of one object twice\n");
    fs::remove(path);
    if (fs::exists(path + ".kept")) fs::rename(path + ".kept", path);
  }
}

TEST_F(TerminalOutputTest, ErrorsThatAChildReportsStayBytesInJson) {
  MakeHost();
  Policy("domains/appDom", "-s x\xE2\x80\xAEy grant\n");
  const Arguments arguments{"check", "--json", "--host", Host(), PolicyDir()};
  Terminal terminal;
  const Result result = Command(arguments, [&] {
    const int out = dup(STDOUT_FILENO);
    terminal.Use();
    dup2(out, STDOUT_FILENO);
  });
  EXPECT_EQ(result.out, Command(arguments).out);
  EXPECT_THAT(result.out, HasSubstr("x\xE2\x80\xAEy"));
}

}  // namespace
}  // namespace SecPolicyTool
