// What a child process leaves to its parent, and hands to it.
#include "tools/policy/child_process.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <nlohmann/json.hpp>

#include "tests/host/image/temporary_directory.h"
#include "tools/policy/letter.h"

namespace SecPolicyTool {
namespace {

using nlohmann::json;

int endMark = -1;

void MarkTheEnd() {
  if (endMark >= 0) static_cast<void>(write(endMark, "the end\n", 8));
}

int ExitStatusOf(const std::function<int()>& work) {
  const int status = RunInChild(
      work, [](std::string&) {}, [] {});
  return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

TEST(ChildProcessTest, ParentsEndIsTheParentsAlone) {
  const StandIn::TemporaryDirectory directory;
  const std::string path = directory / "written";
  std::atexit(MarkTheEnd);
  endMark = open(path.c_str(), O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC, 0666);
  EXPECT_EQ(ExitStatusOf([] { return 7; }), 7);
  close(endMark);
  endMark = -1;
  EXPECT_EQ(std::filesystem::file_size(path), 0u);
}

TEST(ChildProcessTest, WhatAStreamHoldsIsWrittenOnce) {
  const StandIn::TemporaryDirectory directory;
  const std::string path = directory / "written";
  std::FILE* const file = std::fopen(path.c_str(), "w");
  std::fputs("held back\n", file);
  EXPECT_EQ(ExitStatusOf([] { return 0; }), 0);
  std::fclose(file);
  EXPECT_EQ(std::filesystem::file_size(path), 10u);
}

TEST(LetterTest, StringsOfAnyBytesComeBack) {
  const Letter letter;
  EXPECT_EQ(letter.Read(), json());
  const json content{{"bytes", std::string("a\0\xff", 3)}, {"list", {1, 2}}};
  EXPECT_EQ(ExitStatusOf([&] {
              letter.Write(content);
              return 0;
            }),
            0);
  EXPECT_EQ(letter.Read(), content);
}

TEST(LetterTest, HalfALetterIsNoContent) {
  const Letter letter;
  letter.WriteBytes("\xa1\x65half");
  EXPECT_THROW(static_cast<void>(letter.Read()), json::exception);
}

// The child makes its standard streams anew, and must not do so in the place of the letter.
TEST(LetterTest, IsNeverAStandardStream) {
  EXPECT_EQ(ExitStatusOf([] {
              close(STDIN_FILENO);
              const Letter letter;
              return letter.Descriptor() > STDERR_FILENO ? 0 : 1;
            }),
            0);
}

}  // namespace
}  // namespace SecPolicyTool
