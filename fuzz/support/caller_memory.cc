#include "fuzz/support/caller_memory.h"

#include <sys/mman.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <stdexcept>

#include "platform/zek_access.h"

namespace Fuzz {

using ZekCtl::Security::ZekAccess_FileRule;

namespace {

constexpr std::size_t kReadable = CallerMemory::kWritable + CallerMemory::kPage;
constexpr std::size_t kStep = 256;
constexpr std::size_t kAll = kReadable + 2 * CallerMemory::kPage;

// Addresses that are nobody's: at both ends, around the middle that no machine maps, and ones from
// which a few bytes more lead around to 0.
constexpr std::array<std::uint64_t, 8> kNobodys{
    0, 1, 0x7fff'ffff'fff0, 1ULL << 63, 0xffff'8000'0000'0000, ~0ULL, ~0ULL - 2, ~0ULL - 4095};

}  // namespace

CallerMemory::CallerMemory() {
  void* const all = mmap(nullptr, kAll, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (all == MAP_FAILED) throw std::runtime_error("no memory could be mapped");
  memory_ = static_cast<char*>(all) + kPage;
  mprotect(memory_, kReadable, PROT_READ | PROT_WRITE);
  std::memset(memory_ + kWritable, 'r', kPage);
  mprotect(memory_ + kWritable, kPage, PROT_READ);
}

CallerMemory::~CallerMemory() { munmap(memory_ - kPage, kAll); }

void CallerMemory::Reset() { std::memset(memory_, 0xa5, kWritable); }

std::uint64_t CallerMemory::Address(Input& input) const {
  const std::uint8_t kind = input.Byte();
  const std::uint16_t offset = input.Short();
  switch (kind % 8) {
    case 0:
      return kNobodys[offset % kNobodys.size()];
    case 1:
      return Begin() - offset % 64;
    case 2:
      return Begin() + kWritable - offset % 64;
    case 3:
      return Begin() + kReadable - offset % 64;
    case 4:
      return Begin() + kWritable + offset % kPage;
    default:
      return Begin() + offset % kWritable;
  }
}

std::uint64_t CallerMemory::PutText(Input& input, std::string_view text) {
  const std::size_t offset = input.Short() % (kWritable - text.size());
  std::memcpy(memory_ + offset, text.data(), text.size());
  memory_[offset + text.size()] = '\0';
  return Begin() + offset;
}

void CallerMemory::Put(std::uint64_t address, const void* bytes, std::size_t size) {
  if (address < Begin() || address > Begin() + kWritable - size) return;
  std::memcpy(memory_ + (address - Begin()), bytes, size);
}

void CallerMemory::PutRecord(std::uint64_t address, const std::string& path,
                             std::uint32_t permission) {
  ZekAccess_FileRule record{};
  path.copy(record.path, sizeof record.path);
  record.permission = permission;
  Put(address, &record, sizeof record);
}

void CallerMemory::PutNumber(std::uint64_t address, std::uint32_t number) {
  Put(address, &number, sizeof number);
}

std::string CallerMemory::Bytes(std::uint64_t address, std::size_t size) const {
  const bool isHere =
      address >= Begin() && size <= kReadable && address - Begin() <= kReadable - size;
  return isHere ? std::string(memory_ + (address - Begin()), size) : std::string();
}

void CallerMemory::Remember() { remembered_.assign(memory_, memory_ + kReadable); }

bool CallerMemory::IsUnchangedBut(std::uint64_t address, std::size_t size,
                                  std::uint64_t cell) const {
  for (std::size_t i = 0; i < kReadable; ++i) {
    // Nearly all of it is as it was, which is seen faster for many bytes at a time.
    while (i % kStep == 0 && i < kReadable &&
           std::memcmp(memory_ + i, remembered_.data() + i, kStep) == 0) {
      i += kStep;
    }
    const std::uint64_t here = Begin() + i;
    const bool mayChange = here - address < size || here - cell < sizeof(std::uint32_t);
    if (i < kReadable && memory_[i] != remembered_[i] && !mayChange) return false;
  }
  return true;
}

}  // namespace Fuzz
