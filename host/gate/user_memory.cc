#include "host/gate/user_memory.h"

#include <sys/uio.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>

namespace StandIn {

namespace {

constexpr std::size_t kPage = 4096;   // the smallest there is
constexpr std::size_t kChunk = 1024;  // of a string; most fit into one

std::size_t BytesToPageEnd(std::uint64_t address) { return kPage - address % kPage; }

// Copies through the kernel, which checks every address, instead of touching the memory here.
using Copy = ssize_t (*)(pid_t, const iovec*, unsigned long, const iovec*, unsigned long,
                         unsigned long);

bool CopiesMemory(Copy copy, std::uint64_t address, void* here, std::size_t size) noexcept {
  const iovec local{here, size};
  const iovec remote{reinterpret_cast<void*>(address), size};
  return copy(getpid(), &local, 1, &remote, 1, 0) == static_cast<ssize_t>(size);
}

void CopyMemory(Copy copy, std::uint64_t address, void* here, std::size_t size) {
  if (size != 0 && !CopiesMemory(copy, address, here, size)) throw BadArgument{EFAULT};
}

}  // namespace

bool TryReadMemory(std::uint64_t address, void* to, std::size_t size) noexcept {
  return CopiesMemory(process_vm_readv, address, to, size);
}

void UserMemory::Write(std::uint64_t address, const void* from, std::size_t size) const {
  CopyMemory(process_vm_writev, address, const_cast<void*>(from), size);
}

void UserMemory::RequireWritable(std::uint64_t address, std::size_t size) const {
  // Written over with what it holds.
  CopyMemory(process_vm_writev, address, reinterpret_cast<void*>(address), size);
}

void UserMemory::Expect(std::initializer_list<Piece> pieces) {
  std::array<iovec, kPieces> here;
  std::array<iovec, kPieces> there;
  std::size_t count = 0;
  for (const auto& [address, size] : pieces) {
    Copy& copy = copies_.at(count);
    copy.address = address;
    copy.size = std::min({size, kMostBytes, BytesToPageEnd(address)});
    here[count] = {copy.bytes.data(), copy.size};
    there[count] = {reinterpret_cast<void*>(address), copy.size};
    ++count;
  }
  const ssize_t result =
      count == 0 ? 0 : process_vm_readv(getpid(), here.data(), count, there.data(), count, 0);
  // Those announced before are gone.
  for (std::size_t i = count; i < kPieces; ++i) copies_[i].size = 0;
  // It ends at the first piece that cannot be read; none is read in part, since none goes beyond
  // its page.
  std::size_t copied = result < 0 ? 0 : static_cast<std::size_t>(result);
  for (Copy& copy : copies_) {
    if (copy.size > copied) copied = 0;
    copy.size = std::min(copy.size, copied);
    copied -= copy.size;
  }
}

std::string_view UserMemory::At(std::uint64_t address) const {
  for (const Copy& copy : copies_) {
    if (address == copy.address) return {copy.bytes.data(), copy.size};
  }
  return {};
}

void UserMemory::Read(std::uint64_t address, void* to, std::size_t size) const {
  const std::string_view copied = At(address);
  if (copied.size() < size) {
    return CopyMemory(process_vm_readv, address, to, size);
  }
  copied.copy(static_cast<char*>(to), size);
}

std::string UserMemory::String(std::uint64_t address, std::size_t room) const {
  std::string text;
  text.reserve(room);  // memory runs out here or nowhere, wherever the string lies in its pages
  std::array<char, kChunk> chunk;
  std::string_view next = At(address).substr(0, room);
  for (;;) {
    const std::size_t end = next.find('\0');
    text.append(next.substr(0, end));
    if (end != std::string_view::npos) return text;
    if (text.size() == room) throw BadArgument{ENAMETOOLONG};
    // Up to the end of a page at most: the string may end just before memory that cannot be read.
    const std::uint64_t from = address + text.size();
    const std::size_t size = std::min({chunk.size(), BytesToPageEnd(from), room - text.size()});
    CopyMemory(process_vm_readv, from, chunk.data(), size);
    next = {chunk.data(), size};
  }
}

}  // namespace StandIn
