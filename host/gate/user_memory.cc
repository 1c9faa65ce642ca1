#include "host/gate/user_memory.h"

#include <sys/uio.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <vector>

namespace StandIn {

namespace {

constexpr std::size_t kPage = 4096;  // the smallest there is

// Copies through the kernel, which checks every address, instead of touching the memory here.
using Copy = ssize_t (*)(pid_t, const iovec*, unsigned long, const iovec*, unsigned long,
                         unsigned long);

void CopyMemory(Copy copy, std::uint64_t address, void* here, std::size_t size) {
  if (size == 0) return;
  const iovec local{here, size};
  const iovec remote{reinterpret_cast<void*>(address), size};
  const ssize_t copied = copy(getpid(), &local, 1, &remote, 1, 0);
  if (copied != static_cast<ssize_t>(size)) throw BadArgument{EFAULT};
}

}  // namespace

void ReadMemory(std::uint64_t address, void* to, std::size_t size) {
  CopyMemory(process_vm_readv, address, to, size);
}

void WriteMemory(std::uint64_t address, const void* from, std::size_t size) {
  CopyMemory(process_vm_writev, address, const_cast<void*>(from), size);
}

void ProbeWritable(std::uint64_t address, std::size_t size) {
  std::vector<char> content(size);
  ReadMemory(address, content.data(), size);
  WriteMemory(address, content.data(), size);
}

std::string ReadString(std::uint64_t address, std::size_t room) {
  std::string text;
  text.reserve(room);  // memory runs out here or nowhere, wherever the string lies in its pages
  std::array<char, kPage> chunk;
  while (text.size() < room) {
    // Up to the end of a page: the string may end just before memory that cannot be read.
    const std::size_t toPageEnd = kPage - (address + text.size()) % kPage;
    const std::size_t size = std::min(toPageEnd, room - text.size());
    ReadMemory(address + text.size(), chunk.data(), size);
    const char* end = std::find(chunk.data(), chunk.data() + size, '\0');
    text.append(static_cast<const char*>(chunk.data()), end);
    if (end != chunk.data() + size) return text;
  }
  throw BadArgument{ENAMETOOLONG};
}

}  // namespace StandIn
