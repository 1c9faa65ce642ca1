#include "tests/support/counted_memory.h"

#include <malloc.h>

#include <cstdlib>
#include <limits>
#include <new>

namespace {

using SecPolicyTest::MemoryUse;
using SecPolicyTest::Shortage;

constexpr std::uint64_t kNever = std::numeric_limits<std::uint64_t>::max();

MemoryUse live;
std::uint64_t allocations = 0;
std::uint64_t failing = kNever;
Shortage shortage = Shortage::kOne;
bool failed = false;
int ownMemory = 0;

bool FailsNow() noexcept {
  if (ownMemory > 0) return false;
  const std::uint64_t number = allocations++;
  const bool fails = number == failing || (number > failing && shortage == Shortage::kLasting);
  failed |= fails;
  return fails;
}

void Release(void* memory) noexcept {
  if (memory == nullptr) return;
  --live.blocks;
  live.bytes -= static_cast<long>(malloc_usable_size(memory));
  std::free(memory);
}

}  // namespace

// In place of the standard library's for the whole program.
void* operator new(std::size_t size) {
  if (FailsNow()) throw std::bad_alloc();
  void* const memory = std::malloc(size == 0 ? 1 : size);
  if (memory == nullptr) throw std::bad_alloc();
  ++live.blocks;
  live.bytes += static_cast<long>(malloc_usable_size(memory));
  return memory;
}

void* operator new(std::size_t size, const std::nothrow_t&) noexcept try {
  return operator new(size);
} catch (const std::bad_alloc&) {
  return nullptr;
}

void operator delete(void* memory) noexcept { Release(memory); }
void operator delete(void* memory, std::size_t) noexcept { Release(memory); }

namespace SecPolicyTest {

MemoryUse LiveMemory() noexcept { return live; }

void FailAllocation(std::uint64_t number, Shortage howLong) noexcept {
  allocations = 0;
  failing = number;
  shortage = howLong;
  failed = false;
}

void FailNoAllocation() noexcept { FailAllocation(kNever); }

std::uint64_t Allocations() noexcept { return allocations; }
bool AllocationFailed() noexcept { return failed; }

OwnMemory::OwnMemory() noexcept { ++ownMemory; }
OwnMemory::~OwnMemory() { --ownMemory; }

}  // namespace SecPolicyTest
