// Ownership of file descriptors.
#pragma once

#include <unistd.h>

#include <utility>

namespace StandIn {

// The one owner of a descriptor: closes it when it ends. Move-only; holds nothing (-1) after a
// move.
class UniqueFd {
 public:
  UniqueFd() = default;
  // Takes `fd` over; -1 for none, so that the result of an opening call can be handed in unchecked.
  explicit UniqueFd(int fd) noexcept : fd_(fd) {}
  ~UniqueFd() { Reset(); }
  UniqueFd(UniqueFd&& other) noexcept : fd_(other.Release()) {}
  UniqueFd& operator=(UniqueFd&& other) noexcept {
    if (this != &other) {
      Reset();
      fd_ = other.Release();
    }
    return *this;
  }
  UniqueFd(const UniqueFd&) = delete;
  UniqueFd& operator=(const UniqueFd&) = delete;

  [[nodiscard]] int Get() const noexcept { return fd_; }
  [[nodiscard]] bool IsOpen() const noexcept { return fd_ >= 0; }
  // Gives the descriptor away; the caller closes it.
  [[nodiscard]] int Release() noexcept { return std::exchange(fd_, -1); }
  void Reset() noexcept {
    if (fd_ >= 0) {
      ::close(std::exchange(fd_, -1));
    }
  }

 private:
  int fd_ = -1;
};

}  // namespace StandIn
