// The memory of whoever calls the kernel.
#pragma once

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <string>

namespace StandIn {

// An argument that cannot be used: thrown with the errno that a kernel would answer.
struct BadArgument {
  int number;
};

// Access to addresses that a caller handed over. All throw BadArgument EFAULT for memory that
// cannot be read or written, as far as that can be told.
class CallerMemory {
 public:
  struct Piece {
    std::uint64_t address;
    std::size_t size;
  };

  virtual ~CallerMemory() = default;

  virtual void Read(std::uint64_t address, void* to, std::size_t size) const = 0;
  virtual void Write(std::uint64_t address, const void* from, std::size_t size) const = 0;
  // Makes sure that the memory can be written, without changing it.
  virtual void RequireWritable(std::uint64_t address, std::size_t size) const = 0;
  // The NUL-terminated string there, without its NUL. BadArgument ENAMETOOLONG when it and its NUL
  // take more than `room` bytes.
  [[nodiscard]] virtual std::string String(std::uint64_t address, std::size_t room) const = 0;
  // Announces what is read next, at most so many bytes of each piece, for who can fetch it at once.
  virtual void Expect(std::initializer_list<Piece>) {}
};

// The memory of callers in this process's own code: addresses are valid or null.
class OwnMemory final : public CallerMemory {
 public:
  void Read(std::uint64_t address, void* to, std::size_t size) const override;
  void Write(std::uint64_t address, const void* from, std::size_t size) const override;
  void RequireWritable(std::uint64_t address, std::size_t size) const override;
  [[nodiscard]] std::string String(std::uint64_t address, std::size_t room) const override;
};

}  // namespace StandIn
