// The doors that everything that can fail passes: they count, record, and make one call fail.
#pragma once

#include <string_view>

#include "tests/faults/event_record.h"
#include "tests/faults/fault.h"

namespace SecPolicyFaults {

inline constexpr char kRefusalText[] = "refused by the campaign";

// What a door does with a call.
enum class Verdict : std::uint8_t { kPass, kFail, kFailGently };

// Watches this process from here on, to `events`; what it prints goes to `out` and `err`.
struct Records {
  EventRecord events;
  TextRecord out;
  TextRecord err;

  void Clear() noexcept;
};
void Watch(Records& records);

// While an object of this lives, calls are counted and recorded, and `fault` happens.
class Watching {
 public:
  Watching(const Fault* fault, const MissingPolicy* missing);
  ~Watching();
  Watching(const Watching&) = delete;
  Watching& operator=(const Watching&) = delete;
};

// While an object of this lives, what is asked is the kernel's own business: the doors to files and
// directories are open.
class InsideKernel {
 public:
  InsideKernel() noexcept;
  ~InsideKernel();
  InsideKernel(const InsideKernel&) = delete;
  InsideKernel& operator=(const InsideKernel&) = delete;
};

// Whether the process is watched and outside the kernel.
bool IsWatched() noexcept;

// How often each door was passed in the watching that is on, or the last one.
std::uint64_t Passed(Door door) noexcept;

// Counts a call at a door and says what becomes of it. Everything passes unless IsWatched(), at
// kOperation unless the process is watched.
Verdict Pass(Door door) noexcept;
// The kind of the fault that happens, for doors at which several can.
FaultKind KindOfFault() noexcept;

void Record(EventKind kind, std::string_view text) noexcept;
// `what` and `path` with a blank between.
void Record(EventKind kind, std::string_view what, std::string_view path) noexcept;

// Whether the listing of this directory that begins now is the one from which entries are hidden:
// the first in which the directory is listed.
bool IsHiding(std::string_view directory) noexcept;
// Whether the entry of this name is to be seen in that listing.
bool IsSeen(std::string_view name) noexcept;
// How much of the file is to be seen.
std::size_t SeenBytes(std::string_view file) noexcept;

}  // namespace SecPolicyFaults
