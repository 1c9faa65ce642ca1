#include "bench/support/allocations.h"

#include <malloc.h>
#include <sys/resource.h>

#include <cstdlib>
#include <new>

namespace {

std::uint64_t allocations = 0;

}  // namespace

// In place of the standard library's, which do just the same but for the count.
void* operator new(std::size_t size) {
  ++allocations;
  void* const memory = std::malloc(size == 0 ? 1 : size);
  if (memory == nullptr) throw std::bad_alloc();
  return memory;
}

void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }

namespace SecPolicyBench {

std::uint64_t Allocations() noexcept { return allocations; }

std::size_t HeapBytes() noexcept {
  const auto use = mallinfo2();
  return use.uordblks + use.hblkhd;
}

std::size_t PeakBytes() noexcept {
  rusage use{};
  getrusage(RUSAGE_SELF, &use);
  return static_cast<std::size_t>(use.ru_maxrss) * 1024;
}

}  // namespace SecPolicyBench
