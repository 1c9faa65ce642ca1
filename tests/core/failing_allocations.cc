#include "tests/core/failing_allocations.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <new>

namespace {

constexpr long kNever = -1;

// Counted down by every allocation while it is not kNever; the one that finds 0 fails.
long allocationsLeft = kNever;

}  // namespace

// In place of the standard library's for the whole program.
void* operator new(std::size_t size) {
  if (allocationsLeft == 0) {
    allocationsLeft = kNever;
    throw std::bad_alloc();
  }
  if (allocationsLeft > 0) --allocationsLeft;
  if (void* memory = std::malloc(size == 0 ? 1 : size)) return memory;
  throw std::bad_alloc();
}

void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }

namespace SecPolicyTest {

unsigned int FailEveryAllocationInTurn(const std::function<void()>& body) {
  for (long allocations = 0;; ++allocations) {
    bool threw = false;
    allocationsLeft = allocations;
    try {
      body();
    } catch (const std::bad_alloc&) {
      threw = true;
    }
    const bool failed = allocationsLeft == kNever;
    allocationsLeft = kNever;
    if (!failed) return static_cast<unsigned int>(allocations);
    EXPECT_TRUE(threw) << "allocation " << allocations;
  }
}

}  // namespace SecPolicyTest
