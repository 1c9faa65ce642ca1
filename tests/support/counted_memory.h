// The program's memory by operator new: counted, and failing on demand.
#pragma once

#include <cstdint>

namespace SecPolicyTest {

// What operator new has given and operator delete has not taken back.
struct MemoryUse {
  long blocks = 0;
  long bytes = 0;

  friend bool operator==(const MemoryUse&, const MemoryUse&) = default;
};

MemoryUse LiveMemory() noexcept;

// What fails: one allocation, or that one and all behind it.
enum class Shortage : std::uint8_t { kOne, kLasting };

// Counts allocations from 0 again and has the one of this number fail with std::bad_alloc.
void FailAllocation(std::uint64_t number, Shortage shortage = Shortage::kOne) noexcept;
// Counts allocations from 0 again; none fails from here on.
void FailNoAllocation() noexcept;

// How many allocations were made, or failed, since one of the two was called.
std::uint64_t Allocations() noexcept;
// Whether one failed on demand since then.
bool AllocationFailed() noexcept;

// While an object of this lives, allocations are neither numbered nor failed: for what a test does
// itself in the midst of what it tests.
class OwnMemory {
 public:
  OwnMemory() noexcept;
  ~OwnMemory();
  OwnMemory(const OwnMemory&) = delete;
  OwnMemory& operator=(const OwnMemory&) = delete;
};

}  // namespace SecPolicyTest
