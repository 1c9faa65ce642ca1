// The campaign's score, in memory that its processes share.
#pragma once

#include <sys/mman.h>

#include <array>
#include <new>
#include <string>

#include "tests/faults/campaign.h"
#include "tests/faults/fault.h"

namespace SecPolicyFaults {

inline constexpr std::size_t kMostScenarios = 64;

struct Cell {
  Score score;
  std::uint64_t possible = 0;  // calls at the door in the undisturbed run
  std::uint64_t stride = 1;
};

struct Scoreboard {
  std::array<std::array<Cell, kFaults.size()>, kMostScenarios> cells;
  // What is being tried; a process that dies there is succeeded by one that goes on behind it.
  std::size_t scenario = 0;
  std::size_t fault = 0;
  std::uint64_t number = 0;
  bool done = false;

  // Zero, shared with all children, never given back.
  static Scoreboard* Make() {
    void* const memory = mmap(nullptr, sizeof(Scoreboard), PROT_READ | PROT_WRITE,
                              MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (memory == MAP_FAILED) throw std::bad_alloc();
    return new (memory) Scoreboard;
  }
};

// Prints the table; the total.
Score PrintScore(const std::vector<Scenario>& scenarios, const Scoreboard& board);

}  // namespace SecPolicyFaults
