#include "tools/policy/child_process.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <exception>
#include <iostream>
#include <string_view>
#include <system_error>

#include "host/image/unique_fd.h"
#include "tools/policy/error_messages.h"
#include "tools/policy/exit_status.h"
#include "tools/policy/output.h"
#include "tools/policy/terminal.h"

namespace SecPolicyTool {

using StandIn::UniqueFd;

namespace {

[[noreturn]] void ThrowSystemError(const char* call) {
  throw std::system_error(errno, std::generic_category(), call);
}

// What the parent registered for its own end, and what its streams still hold, stays the parent's.
[[noreturn]] void BeChild(const std::function<int()>& work, UniqueFd errors) {
  int status = kFailed;
  try {
    if (dup2(errors.Get(), STDERR_FILENO) < 0) ThrowSystemError("dup2");
    StopEscaping(std::cerr);  // a pipe now, whatever it was
    errors.Reset();
    status = work();
    FlushOutput();
  } catch (const std::exception& failure) {
    ReportError(MessageOf(failure));
    status = kFailed;
  }
  _exit(status);
}

// Hands over the complete lines of `text` and leaves the rest in it.
void TakeLines(std::string& text, const std::function<void(std::string&)>& line) {
  std::size_t start = 0;
  for (std::size_t end; (end = text.find('\n', start)) != std::string::npos; start = end + 1) {
    std::string whole = text.substr(start, end - start);
    line(whole);
  }
  text.erase(0, start);
}

// Calls `tick` until something can be read.
void AwaitInput(int fd, const std::function<void()>& tick) {
  constexpr int kTickMilliseconds = 200;
  for (;;) {
    pollfd input{fd, POLLIN, 0};
    if (poll(&input, 1, kTickMilliseconds) != 0) return;
    tick();
  }
}

void ReadLines(int fd, const std::function<void(std::string&)>& line,
               const std::function<void()>& tick) {
  std::string text;
  std::array<char, 4096> buffer;
  for (;;) {
    AwaitInput(fd, tick);
    const ssize_t size = read(fd, buffer.data(), buffer.size());
    if (size < 0 && errno == EINTR) continue;
    if (size <= 0) break;
    text.append(buffer.data(), static_cast<std::size_t>(size));
    TakeLines(text, line);
  }
  if (!text.empty()) line(text);
}

int WaitFor(pid_t child) {
  int status = 0;
  while (waitpid(child, &status, 0) < 0) {
    if (errno != EINTR) ThrowSystemError("waitpid");
  }
  return status;
}

}  // namespace

int RunInChild(const std::function<int()>& work, const std::function<void(std::string& line)>& line,
               const std::function<void()>& tick) {
  int ends[2];
  if (pipe2(ends, O_CLOEXEC) != 0) ThrowSystemError("pipe2");
  UniqueFd readEnd(ends[0]);
  UniqueFd writeEnd(ends[1]);
  const pid_t child = fork();
  if (child < 0) ThrowSystemError("fork");
  if (child == 0) {
    readEnd.Reset();
    BeChild(work, std::move(writeEnd));
  }
  writeEnd.Reset();
  ReadLines(readEnd.Get(), line, tick);
  return WaitFor(child);
}

}  // namespace SecPolicyTool
