// The registers of a trapped system call.
#pragma once

#include <ucontext.h>

#include <cstdint>

namespace StandIn {

// A system call that was trapped instead of carried out, as its signal's context holds it.
class TrappedCall {
 public:
  explicit TrappedCall(ucontext_t& context) : registers_(context.uc_mcontext) {}

  [[nodiscard]] long Number() const;
  // From 0 to 5.
  [[nodiscard]] std::uint64_t Argument(unsigned int index) const;

  // What the caller finds in the first result register, and in the second.
  void SetResult(long result);
  void SetSecondResult(long result);

 private:
  mcontext_t& registers_;
};

}  // namespace StandIn
