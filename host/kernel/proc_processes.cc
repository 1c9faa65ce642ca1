#include "host/kernel/proc_processes.h"

#include <fcntl.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <sstream>
#include <string>

namespace StandIn {

namespace {

// The 22nd field of /proc/PID/stat. The second one, the program's name in parentheses, may hold
// anything, so that fields are counted from its end.
constexpr int kFieldsBetweenNameAndStart = 19;

// Several times what the line takes up to that field.
constexpr std::size_t kStatBytes = 1024;

std::uint64_t StartTimeIn(const std::string& stat) {
  const std::size_t nameEnd = stat.rfind(')');
  if (nameEnd == std::string::npos) return 0;
  std::istringstream fields(stat.substr(nameEnd + 1));
  std::string skipped;
  for (int i = 0; i < kFieldsBetweenNameAndStart; ++i) fields >> skipped;
  std::uint64_t start = 0;
  fields >> start;
  return start;
}

}  // namespace

ProcProcesses::ProcProcesses() : proc_(open("/proc", O_PATH | O_DIRECTORY | O_CLOEXEC)) {}

ProcessIdentity ProcProcesses::Self() const { return {getpid(), StartTime(getpid())}; }

bool ProcProcesses::Runs(const ProcessIdentity& process) const {
  if (!proc_.IsOpen()) {
    return process.pid > 0 && (kill(process.pid, 0) == 0 || errno == EPERM);
  }
  const std::uint64_t start = StartTime(process.pid);
  return start != 0 && start == process.startTime;
}

std::uint64_t ProcProcesses::StartTime(pid_t pid) const {
  if (!proc_.IsOpen()) return 0;
  const UniqueFd file(
      openat(proc_.Get(), (std::to_string(pid) + "/stat").c_str(), O_RDONLY | O_CLOEXEC));
  std::array<char, kStatBytes> stat;
  const ssize_t size = read(file.Get(), stat.data(), stat.size());
  // Nothing can be read of a process that has ended meanwhile.
  return size > 0 ? StartTimeIn(std::string(stat.data(), static_cast<std::size_t>(size))) : 0;
}

}  // namespace StandIn
