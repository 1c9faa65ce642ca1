// How often the program asks for memory.
#pragma once

#include <cstddef>
#include <cstdint>

namespace SecPolicyBench {

// Calls of operator new since the program began. It has one thread.
std::uint64_t Allocations() noexcept;

// Bytes that the allocator has given out, its own with them.
std::size_t HeapBytes() noexcept;

// The most memory that this process has had at a time, in bytes.
std::size_t PeakBytes() noexcept;

}  // namespace SecPolicyBench
