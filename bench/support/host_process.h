// Processes of a host, in which one thing is measured each.
#pragma once

#include <benchmark/benchmark.h>

#include <functional>
#include <string>

namespace SecPolicyBench {

struct Cost {
  double seconds = 0;
  double allocations = 0;
  double peakBytes = 0;  // beyond what the process had before
};

// What `work` costs here and now.
Cost Measure(const std::function<void()>& work);

// A host directory in memory, whose kernel starts anew in every process.
class BenchHost {
 public:
  // A host without a file.
  static const BenchHost& Plain();
  // One with `kTreeFiles` files below /tree, a thousand a directory.
  static const BenchHost& WithTree();
  static constexpr int kTreeFiles = 100'000;
  // None: its processes are ordinary ones.
  static const BenchHost& Outside();

  // What `body` returns in a new process of the host; `visible` is a directory to be found there.
  // Throws std::runtime_error with the process's own words when it fails.
  [[nodiscard]] Cost Run(const std::string& visible, const std::function<Cost()>& body) const;

 private:
  explicit BenchHost(const std::string& path) : path_(path) {}
  [[nodiscard]] Cost Inside(const std::string& visible, const std::function<Cost()>& body) const;

  std::string path_;  // empty for none
};

// The directory of everything that is written, in memory where the machine has such a place;
// removed at the program's end.
const std::string& Scratch();

// A process of its own for each iteration; the time that counts is what `body` says. Its
// allocations and its peak are given for each of `items`.
void RunEach(benchmark::State& state, const BenchHost& host, const std::string& visible,
             double items, const std::function<Cost()>& body);

}  // namespace SecPolicyBench
