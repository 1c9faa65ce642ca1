#include "host/kernel/caller_memory.h"

#include <cerrno>
#include <cstring>

namespace StandIn {

namespace {

template <typename Byte>
Byte* At(std::uint64_t address, std::size_t size) {
  if (address == 0 && size != 0) throw BadArgument{EFAULT};
  return reinterpret_cast<Byte*>(address);
}

}  // namespace

void OwnMemory::Read(std::uint64_t address, void* to, std::size_t size) const {
  if (size != 0) std::memcpy(to, At<const char>(address, size), size);
}

void OwnMemory::Write(std::uint64_t address, const void* from, std::size_t size) const {
  if (size != 0) std::memcpy(At<char>(address, size), from, size);
}

void OwnMemory::RequireWritable(std::uint64_t address, std::size_t size) const {
  At<char>(address, size);
}

std::string OwnMemory::String(std::uint64_t address, std::size_t room) const {
  const char* text = At<const char>(address, room);
  const std::size_t size = strnlen(text, room);
  if (size == room) throw BadArgument{ENAMETOOLONG};
  return {text, size};
}

}  // namespace StandIn
