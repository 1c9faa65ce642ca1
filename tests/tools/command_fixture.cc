#include "tests/tools/command_fixture.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <future>
#include <sstream>
#include <stdexcept>

#include "host/files/file_io.h"
#include "host/files/unique_fd.h"

namespace SecPolicyTool {

using StandIn::UniqueFd;

namespace {

namespace fs = std::filesystem;

struct Pipe {
  Pipe() {
    int ends[2];
    if (pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("no pipe can be made");
    readEnd = UniqueFd(ends[0]);
    writeEnd = UniqueFd(ends[1]);
  }

  UniqueFd readEnd;
  UniqueFd writeEnd;
};

[[noreturn]] void BeProgram(const std::string& program, const Arguments& arguments,
                            const std::function<void()>& prepare) {
  std::vector<char*> pointers{const_cast<char*>(program.c_str())};
  for (const std::string& argument : arguments) {
    pointers.push_back(const_cast<char*>(argument.c_str()));
  }
  pointers.push_back(nullptr);
  prepare();
  execv(program.c_str(), pointers.data());
  _exit(127);
}

}  // namespace

std::vector<std::string> Result::Errors() const {
  std::vector<std::string> lines;
  std::istringstream stream(err);
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  return lines;
}

Result RunProgram(const std::string& program, const Arguments& arguments,
                  const std::function<void()>& prepare) {
  Pipe out;
  Pipe err;
  const pid_t child = fork();
  if (child < 0) throw std::runtime_error("cannot fork");
  if (child == 0) {
    dup2(out.writeEnd.Get(), STDOUT_FILENO);
    dup2(err.writeEnd.Get(), STDERR_FILENO);
    BeProgram(program, arguments, prepare);
  }
  out.writeEnd.Reset();
  err.writeEnd.Reset();
  auto errors =
      std::async(std::launch::async, [&] { return StandIn::ReadAll(err.readEnd.Get(), "errors"); });
  Result result;
  result.out = StandIn::ReadAll(out.readEnd.Get(), "output");
  result.err = errors.get();
  int status = 0;
  waitpid(child, &status, 0);
  if (WIFEXITED(status)) result.status = WEXITSTATUS(status);
  return result;
}

CommandTest::CommandTest() : base_(fs::path(directory_.Path()).lexically_normal()) {
  for (const char* name : {"objects", "domains", "fileLabels"}) {
    fs::create_directories(PolicyDir() + "/" + name);
  }
  for (const char* domain : {"appDom", "globalVMDom", "ioFilterDom"}) {
    Policy(std::string("domains/") + domain, "# no rules\n");
  }
}

Result CommandTest::Command(const Arguments& arguments,
                            const std::function<void()>& prepare) const {
  return RunProgram(SECPOLICY_COMMAND, arguments, [&] {
    setenv("XDG_STATE_HOME", Path("state").c_str(), 1);
    unsetenv("HOME");
#if defined(SECPOLICY_ADDRESS_SANITIZER)
    // The search for leaks needs /proc, which a host doesn't have.
    setenv("ASAN_OPTIONS", "detect_leaks=0", 1);
#endif
    prepare();
  });
}

Result CommandTest::Done(const Arguments& arguments) const {
  Result result = Command(arguments);
  EXPECT_EQ(result.status, 0) << result.err;
  return result;
}

void CommandTest::MakeHost(
    const std::vector<std::pair<std::string, StandIn::Archive>>& tardisks) const {
  Done({"host", "init", Host()});
  for (const auto& [name, archive] : tardisks) {
    StandIn::WriteBytes(Host() + "/tardisks/" + name, archive.Bytes());
  }
  Done({"host", "assemble", Host()});
}

void CommandTest::Policy(const std::string& file, const std::string& text) const {
  StandIn::WriteBytes(PolicyDir() + "/" + file, text);
}

Result CommandTest::Load(const Arguments& more) const {
  Arguments arguments{"load", "--host", Host()};
  arguments.insert(arguments.end(), more.begin(), more.end());
  arguments.push_back(PolicyDir());
  return Command(arguments);
}

}  // namespace SecPolicyTool
