// Printing of what the kernel holds.
#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <unistd.h>

#include <fstream>
#include <iostream>
#include <stdexcept>

#include "bench/support/host_process.h"
#include "bench/support/rules.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicyBench {
namespace {

constexpr std::size_t kRules = 100'000;

const std::string& ShownPolicy() {
  static const std::string dir = WritePolicy(Scratch(), kRules);
  return dir;
}

// Standard output goes to the file from here on.
void WriteTo(const std::string& path) {
  const int fd = open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
  if (fd < 0 || dup2(fd, STDOUT_FILENO) < 0) throw std::runtime_error("no file for the output");
}

void Display(benchmark::State& state) {
  RunEach(state, BenchHost::Plain(), ShownPolicy(), kRules, [] {
    SecPolicy::LoadPolicy(ShownPolicy());
    WriteTo("/shown");
    ZekCtl::Security::ZekAccessInterfaceImpl iface;
    return Measure([&] { SecPolicy::DisplayPolicyDomains(iface, ""); });
  });
}
BENCHMARK(Display)->Name("display/library")->UseManualTime();

void SameLines(benchmark::State& state) {
  RunEach(state, BenchHost::Plain(), ShownPolicy(), kRules, [] {
    SecPolicy::LoadPolicy(ShownPolicy());
    WriteTo("/shown");
    ZekCtl::Security::ZekAccessInterfaceImpl iface;
    SecPolicy::DisplayPolicyDomains(iface, "");
    std::vector<std::string> lines;
    std::ifstream shown("/shown");
    for (std::string line; std::getline(shown, line);) lines.push_back(line);
    WriteTo("/shown");
    return Measure([&] {
      for (const std::string& line : lines) std::cout << line << std::endl;
    });
  });
}
BENCHMARK(SameLines)->Name("display/same lines")->UseManualTime();

}  // namespace
}  // namespace SecPolicyBench
