// The caller's memory, as a kernel sees it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

namespace StandIn {

// An argument that cannot be used: thrown with the errno that a kernel would answer.
struct BadArgument {
  int number;
};

// Access to addresses that a caller handed over and that may be anything. All throw BadArgument
// EFAULT for memory that cannot be read or written; nothing crashes.

void ReadMemory(std::uint64_t address, void* to, std::size_t size);
void WriteMemory(std::uint64_t address, const void* from, std::size_t size);

// Makes sure that the memory can be written, without changing it.
void ProbeWritable(std::uint64_t address, std::size_t size);

// The NUL-terminated string there, without its NUL. BadArgument ENAMETOOLONG when it and its NUL
// take more than `room` bytes.
std::string ReadString(std::uint64_t address, std::size_t room);

}  // namespace StandIn
