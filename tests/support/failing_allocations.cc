#include "tests/support/failing_allocations.h"

#include <gtest/gtest.h>

#include <new>

#include "tests/support/counted_memory.h"

namespace SecPolicyTest {

unsigned int FailEveryAllocationInTurn(const std::function<void()>& body) {
  for (unsigned int allocations = 0;; ++allocations) {
    bool threw = false;
    FailAllocation(allocations);
    try {
      body();
    } catch (const std::bad_alloc&) {
      threw = true;
    }
    const bool failed = AllocationFailed();
    FailNoAllocation();
    if (!failed) return allocations;
    EXPECT_TRUE(threw) << "allocation " << allocations;
  }
}

}  // namespace SecPolicyTest
