// The memory of any caller of this process, as a kernel sees it.
#pragma once

#include <array>
#include <string_view>

#include "host/kernel/caller_memory.h"

namespace StandIn {

// Addresses may be anything; nothing crashes. Copies through the kernel, which checks every
// address.
//
// What Expect announces is fetched with one system call in place of one for each piece; what cannot
// be copied beforehand, since it cannot be read or is longer than most, is read when it is asked
// for. So errors come where they would.
class UserMemory final : public CallerMemory {
 public:
  UserMemory() = default;

  void Read(std::uint64_t address, void* to, std::size_t size) const override;
  void Write(std::uint64_t address, const void* from, std::size_t size) const override;
  void RequireWritable(std::uint64_t address, std::size_t size) const override;
  [[nodiscard]] std::string String(std::uint64_t address, std::size_t room) const override;
  // At most kPieces, in the order in which they will be read; in place of those announced before.
  void Expect(std::initializer_list<Piece> pieces) override;

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

// Whether the memory could be read, all of it. Safe in signal handlers.
bool TryReadMemory(std::uint64_t address, void* to, std::size_t size) noexcept;

}  // namespace StandIn
