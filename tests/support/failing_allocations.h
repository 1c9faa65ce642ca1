// Memory that runs out in one place after the other.
#pragma once

#include <functional>

namespace SecPolicyTest {

// Calls `body` again and again, first with its first allocation by operator new failing, then with
// its second, and so on, until it needs no further one. Returns how many times it threw
// std::bad_alloc; an allocation whose failure is swallowed is a failed expectation.
unsigned int FailEveryAllocationInTurn(const std::function<void()>& body);

}  // namespace SecPolicyTest
