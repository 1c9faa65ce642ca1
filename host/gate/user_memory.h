// The caller's memory, as a kernel sees it.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>

namespace StandIn {

// An argument that cannot be used: thrown with the errno that a kernel would answer.
struct BadArgument {
  int number;
};

// Access to addresses that a caller handed over and that may be anything. All throw BadArgument
// EFAULT for memory that cannot be read or written; nothing crashes.

void ReadMemory(std::uint64_t address, void* to, std::size_t size);
void WriteMemory(std::uint64_t address, const void* from, std::size_t size);

// Whether the memory could be read, all of it. Safe in signal handlers.
bool TryReadMemory(std::uint64_t address, void* to, std::size_t size) noexcept;

// Makes sure that the memory can be written, without changing it.
void ProbeWritable(std::uint64_t address, std::size_t size);

// The NUL-terminated string there, without its NUL. BadArgument ENAMETOOLONG when it and its NUL
// take more than `room` bytes.
std::string ReadString(std::uint64_t address, std::size_t room);

// What an answer is about to read, for one system call in place of one for each piece. Its
// functions do what those above do; what could not be copied beforehand, since it cannot be read or
// is longer than most, they read when they are asked for it. So errors come where they would.
class MemoryAhead {
 public:
  struct Piece {
    std::uint64_t address;
    std::size_t size;  // at most; what lies behind the end of its page is left for later
  };

  // At most kPieces of them, in the order in which they will be read.
  explicit MemoryAhead(std::initializer_list<Piece> pieces);

  void Read(std::uint64_t address, void* to, std::size_t size) const;
  [[nodiscard]] std::string String(std::uint64_t address, std::size_t room) const;

 private:
  static constexpr std::size_t kPieces = 3;
  static constexpr std::size_t kMostBytes = 256;  // of a piece

  struct Copy {
    std::uint64_t address = 0;
    std::size_t size = 0;
    std::array<char, kMostBytes> bytes;
  };

  // What was copied of the memory at `address`; may be nothing.
  [[nodiscard]] std::string_view At(std::uint64_t address) const;

  std::array<Copy, kPieces> copies_;
};

}  // namespace StandIn
