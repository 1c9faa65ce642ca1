// Moments at which processes are killed.
#pragma once

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <functional>
#include <random>
#include <thread>

#include "tests/crash/process_tree.h"

namespace CrashTest {

using Microseconds = std::chrono::microseconds;

// Moments between the start of something and a little after its end, each as likely as another.
class Moments {
 public:
  explicit Moments(Microseconds duration) : distribution_(0, duration.count() * 11 / 10) {}
  void Pause() { std::this_thread::sleep_for(Microseconds(distribution_(generator_))); }

 private:
  std::mt19937 generator_{20};
  std::uniform_int_distribution<std::int64_t> distribution_;
};

// How long a process takes that nothing disturbs: the shortest of a few, since on a busy machine a
// run may take much longer than the next.
inline Microseconds UndisturbedRun(const std::function<void()>& body) {
  Microseconds shortest = Microseconds::max();
  for (int run = 0; run < 3; ++run) {
    const auto start = std::chrono::steady_clock::now();
    ProcessTree process(body);
    process.Wait();
    const auto taken = std::chrono::steady_clock::now() - start;
    shortest = std::min(shortest, std::chrono::duration_cast<Microseconds>(taken));
  }
  return shortest;
}

}  // namespace CrashTest
