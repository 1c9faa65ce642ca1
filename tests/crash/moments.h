// Moments at which processes are killed.
#pragma once

#include <sys/wait.h>

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

// How long a process takes that nothing disturbs.
inline Microseconds UndisturbedRun(const std::function<void()>& body) {
  const auto start = std::chrono::steady_clock::now();
  ProcessTree process(body);
  process.Wait();
  return std::chrono::duration_cast<Microseconds>(std::chrono::steady_clock::now() - start);
}

}  // namespace CrashTest
