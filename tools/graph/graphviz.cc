#include "tools/graph/graphviz.h"

#include <spawn.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <string_view>
#include <system_error>

#include "host/files/file_io.h"
#include "host/files/unique_fd.h"
#include "host/text/escaped.h"

namespace SecPolicyTool {

namespace {

using StandIn::UniqueFd;

void Check(int number, const char* call) {
  if (number != 0) throw std::system_error(number, std::generic_category(), call);
}

// A file without a name. Unlike a pipe it takes everything at once, so that the program and this
// process never wait for one another.
class Scratch {
 public:
  Scratch() : fd_(memfd_create("graphviz", MFD_CLOEXEC)) {
    Check(fd_.IsOpen() ? 0 : errno, "memfd_create");
  }

  [[nodiscard]] int Get() const { return fd_.Get(); }

  void Fill(std::string_view text) const {
    while (!text.empty()) {
      const ssize_t size = write(fd_.Get(), text.data(), text.size());
      Check(size < 0 ? errno : 0, "write");
      text.remove_prefix(static_cast<std::size_t>(size));
    }
    Rewind();
  }

  [[nodiscard]] std::string Content() const {
    Rewind();
    return StandIn::ReadAll(fd_.Get(), "graphviz");
  }

 private:
  void Rewind() const { Check(lseek(fd_.Get(), 0, SEEK_SET) == 0 ? 0 : errno, "lseek"); }

  UniqueFd fd_;
};

// What a new process's standard streams are.
class Streams {
 public:
  Streams(const Scratch& in, const Scratch& out, const Scratch& err) {
    Check(posix_spawn_file_actions_init(&actions_), "posix_spawn_file_actions_init");
    int stream = STDIN_FILENO;
    for (const Scratch* file : {&in, &out, &err}) {
      Check(posix_spawn_file_actions_adddup2(&actions_, file->Get(), stream++), "adddup2");
    }
  }
  ~Streams() { posix_spawn_file_actions_destroy(&actions_); }
  Streams(const Streams&) = delete;
  Streams& operator=(const Streams&) = delete;

  [[nodiscard]] const posix_spawn_file_actions_t* Get() const { return &actions_; }

 private:
  posix_spawn_file_actions_t actions_{};
};

// The wait status of "dot -TFORMAT".
int RunDot(const std::string& format, const Streams& streams) {
  std::string program = "dot";
  std::string option = "-T" + format;
  char* const arguments[] = {program.data(), option.data(), nullptr};
  pid_t child = 0;
  const int failure =
      posix_spawnp(&child, program.c_str(), streams.Get(), nullptr, arguments, environ);
  if (failure == ENOENT || failure == EACCES) throw GraphvizMissing();
  Check(failure, "posix_spawnp");
  int status = 0;
  while (waitpid(child, &status, 0) < 0) Check(errno == EINTR ? 0 : errno, "waitpid");
  return status;
}

std::string Complaint(std::string said, int status) {
  while (said.ends_with('\n')) said.pop_back();
  if (!said.empty()) return StandIn::Escaped(said).Text();
  return WIFSIGNALED(status) ? "signal " + std::to_string(WTERMSIG(status))
                             : "exit status " + std::to_string(WEXITSTATUS(status));
}

}  // namespace

std::string RunGraphviz(const std::string& dot, const std::string& format) {
  const Scratch in;
  const Scratch out;
  const Scratch err;
  in.Fill(dot);
  const int status = RunDot(format, Streams(in, out, err));
  if (status != 0) {
    throw std::runtime_error("Graphviz failed: " + Complaint(err.Content(), status));
  }
  return out.Content();
}

}  // namespace SecPolicyTool
