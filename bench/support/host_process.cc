#include "bench/support/host_process.h"

#include <fcntl.h>
#include <malloc.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <chrono>
#include <cstring>
#include <filesystem>
#include <stdexcept>

#include "bench/support/allocations.h"
#include "fuzz/support/scratch_directory.h"
#include "host/module/description_json.h"
#include "host/root/assemble.h"
#include "host/session/session.h"
#include "tests/support/archives.h"

namespace SecPolicyBench {

namespace {

constexpr int kFilesPerDirectory = 1000;

std::string NewHost(const std::string& name, const StandIn::Archive& archive) {
  const std::string path = Scratch() + "/" + name;
  StandIn::HostDirectory::Create(path, StandIn::DefaultDescriptionText());
  Fuzz::WriteFile(path + "/tardisks/base.tar", archive.Bytes());
  StandIn::Assemble(StandIn::HostDirectory(path));
  return path;
}

StandIn::Archive Tree() {
  StandIn::Archive archive;
  archive.Directory("tree");
  for (int dir = 0; dir < BenchHost::kTreeFiles / kFilesPerDirectory; ++dir) {
    const std::string path = "tree/directory" + std::to_string(dir);
    archive.Directory(path);
    for (int file = 0; file < kFilesPerDirectory; ++file) {
      archive.File(path + "/file" + std::to_string(file), "");
    }
  }
  return archive;
}

// What goes through the pipe from a process.
struct Message {
  Cost cost;
  bool succeeded = false;
  std::array<char, 256> error{};
};

Message Done(const std::function<Cost()>& body) {
  Message message;
  try {
    message.cost = body();
    message.succeeded = true;
  } catch (const std::exception& failure) {
    std::strncpy(message.error.data(), failure.what(), message.error.size() - 1);
  }
  return message;
}

}  // namespace

Cost Measure(const std::function<void()>& work) {
  const std::uint64_t allocations = Allocations();
  const std::size_t peak = PeakBytes();
  const auto start = std::chrono::steady_clock::now();
  work();
  const std::chrono::duration<double> seconds = std::chrono::steady_clock::now() - start;
  return {seconds.count(), static_cast<double>(Allocations() - allocations),
          static_cast<double>(PeakBytes() - peak)};
}

const std::string& Scratch() {
  static const Fuzz::ScratchDirectory directory;
  return directory.Path();
}

const BenchHost& BenchHost::Plain() {
  static const BenchHost host(NewHost("plain", StandIn::Archive().Directory("etc")));
  return host;
}

const BenchHost& BenchHost::WithTree() {
  static const BenchHost host(NewHost("with-tree", Tree()));
  return host;
}

const BenchHost& BenchHost::Outside() {
  static const BenchHost host("");
  return host;
}

Cost BenchHost::Inside(const std::string& visible, const std::function<Cost()>& body) const {
  if (path_.empty()) return body();
  StandIn::SessionOptions options;
  if (!visible.empty()) options.visible = {visible};
  options.kernel = StandIn::SessionOptions::Kernel::kScratch;
  const StandIn::Session session(StandIn::HostDirectory(path_), options);
  return body();
}

Cost BenchHost::Run(const std::string& visible, const std::function<Cost()>& body) const {
  std::array<int, 2> ends{};
  if (pipe2(ends.data(), O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
  // What is free here would be there for the child's taking, and not count.
  malloc_trim(0);
  const pid_t child = fork();
  if (child < 0) throw std::runtime_error("no process");
  if (child == 0) {
    const Message message = Done([&] { return Inside(visible, body); });
    _exit(write(ends[1], &message, sizeof message) == sizeof message ? 0 : 1);
  }
  close(ends[1]);
  Message message;
  const bool isWhole = read(ends[0], &message, sizeof message) == sizeof message;
  close(ends[0]);
  int status = 0;
  waitpid(child, &status, 0);
  if (!isWhole) throw std::runtime_error("the process in the host ended without a word");
  if (!message.succeeded) throw std::runtime_error(message.error.data());
  return message.cost;
}

void RunEach(benchmark::State& state, const BenchHost& host, const std::string& visible,
             double items, const std::function<Cost()>& body) try {
  Cost cost;
  for (auto _ : state) {
    cost = host.Run(visible, body);
    state.SetIterationTime(cost.seconds);
  }
  state.counters["items"] = items;
  state.counters["allocations_each"] = cost.allocations / items;
  state.counters["peak_bytes_each"] = cost.peakBytes / items;
} catch (const std::exception& failure) {
  state.SkipWithError(failure.what());
}

}  // namespace SecPolicyBench
