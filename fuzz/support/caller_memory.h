// Memory of a caller of the kernel, in which every byte that changes is seen.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "fuzz/support/input.h"

namespace Fuzz {

// Some pages that can be written, one that can only be read behind them, and on both sides pages
// that are not there.
class CallerMemory {
 public:
  static constexpr std::size_t kPage = 4096;
  static constexpr std::size_t kWritable = 4 * kPage;

  CallerMemory();
  ~CallerMemory();
  CallerMemory(const CallerMemory&) = delete;
  CallerMemory& operator=(const CallerMemory&) = delete;

  // Puts the memory back as it is at the start of an input: filled with a pattern.
  void Reset();

  // An address that the input chooses: in the writable memory, before or behind one of its ends,
  // in the memory that can only be read, or one that no process has.
  std::uint64_t Address(Input& input) const;

  // The address of `text` with a NUL, which is put at an offset that the input chooses.
  std::uint64_t PutText(Input& input, std::string_view text);
  // Put a rule's record, as the kernel is given them, or a number at `address`, where that is in
  // the writable memory as a whole.
  void PutRecord(std::uint64_t address, const std::string& path, std::uint32_t permission);
  void PutNumber(std::uint64_t address, std::uint32_t number);

  // The bytes of [address, address + size) as far as they are all here; an empty text if not.
  [[nodiscard]] std::string Bytes(std::uint64_t address, std::size_t size) const;

  // Remembers the content; what has changed since then outside the range of `size` bytes at
  // `address` and the cell of 4 bytes at `cell`, whatever may lie elsewhere.
  void Remember();
  [[nodiscard]] bool IsUnchangedBut(std::uint64_t address, std::size_t size,
                                    std::uint64_t cell) const;

 private:
  void Put(std::uint64_t address, const void* bytes, std::size_t size);
  [[nodiscard]] std::uint64_t Begin() const { return reinterpret_cast<std::uint64_t>(memory_); }

  char* memory_;  // kWritable bytes, then kPage bytes to read only
  std::vector<char> remembered_;
};

}  // namespace Fuzz
