// A fuzz input taken apart.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

namespace Fuzz {

inline std::string BytesOf(const std::uint8_t* data, std::size_t size) {
  return {data, data + size};
}

// Takes values from the front; behind the end everything is 0.
class Input {
 public:
  Input(const std::uint8_t* data, std::size_t size) : data_(data), size_(size) {}

  [[nodiscard]] bool IsEmpty() const noexcept { return size_ == 0; }

  std::uint8_t Byte() { return static_cast<std::uint8_t>(Take(1)); }
  std::uint16_t Short() { return static_cast<std::uint16_t>(Take(2)); }
  std::uint64_t Long() { return Take(8); }

 private:
  std::uint64_t Take(std::size_t bytes) {
    std::uint64_t value = 0;
    for (; bytes > 0 && size_ > 0; --bytes, --size_) value = value << 8 | *data_++;
    return value;
  }

  const std::uint8_t* data_;
  std::size_t size_;
};

}  // namespace Fuzz
