// What is made to fail, and how it is counted.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace SecPolicyFaults {

// Each thing that can fail passes one of these.
enum class Door : std::uint8_t {
  kOperation,      // on the module, from the access library or from within a trapped call
  kPrivateCall,    // 16474 to 16488
  kResolvePath,    // prctl
  kSetAttribute,   // setxattr
  kGetAttribute,   // getxattr
  kOpenDirectory,  // opendir
  kReadDirectory,  // readdir64
  kOpen,           // open
  kStatus,         // fstat
  kOpenStream,     // fopen or fopen64, by which a file stream opens
  kRead,           // read, of a file stream
  kMemory,         // operator new
};
inline constexpr std::size_t kDoors = 12;

enum class FaultKind : std::uint8_t {
  kRefusal,
  kOutOfMemory,
  kCall,
  kSilentCall,
  kTooSmall,
  kStatusOne,
  kBareStatus,
  kWideStatus,
  kNegativeStatus,
  kOrdinaryStatus,
  kResolvePath,
  kSetAttribute,
  kGetAttribute,
  kOpenDirectory,
  kReadDirectory,
  kOpen,
  kStatus,
  kOpenStream,
  kRead,
  kAllocation,
  kExhaustion,
};

struct FaultInfo {
  std::string_view name;  // on the command line
  Door door;
};

// By FaultKind.
inline constexpr std::array<FaultInfo, 21> kFaults{{
    {"refusal", Door::kOperation},           // of the module, with a text
    {"out-of-memory", Door::kOperation},     // the access library throws std::bad_alloc
    {"call", Door::kPrivateCall},            // fails with an error value
    {"silent-call", Door::kPrivateCall},     // fails without one
    {"too-small-call", Door::kPrivateCall},  // fails with the status of a table that is too small
    // Any status but 0 is a failure: each of these would pass for success under some wrong test.
    {"status-1-call", Door::kPrivateCall},         // 1
    {"bare-status-call", Door::kPrivateCall},      // the kernel's range of statuses, no number
    {"wide-status-call", Door::kPrivateCall},      // 0 in its lower 32 bits
    {"negative-status-call", Door::kPrivateCall},  // below what an ordinary kernel answers
    {"ordinary-call", Door::kPrivateCall},         // a kernel that does not know the call
    {"resolve-path", Door::kResolvePath},
    {"set-attribute", Door::kSetAttribute},
    {"get-attribute", Door::kGetAttribute},
    {"open-directory", Door::kOpenDirectory},
    {"read-directory", Door::kReadDirectory},
    {"open", Door::kOpen},
    {"status", Door::kStatus},
    {"open-stream", Door::kOpenStream},
    {"read", Door::kRead},
    {"allocation", Door::kMemory},  // one fails
    {"exhaustion", Door::kMemory},  // one fails, and all behind it
}};

constexpr const FaultInfo& InfoOf(FaultKind kind) {
  return kFaults[static_cast<std::size_t>(kind)];
}

// The kind of that name; nothing when there is none.
constexpr std::optional<FaultKind> FindFault(std::string_view name) {
  for (std::size_t i = 0; i < kFaults.size(); ++i) {
    if (kFaults[i].name == name) return static_cast<FaultKind>(i);
  }
  return std::nullopt;
}

// One fault: the call of that number, from 0, at the kind's door.
struct Fault {
  FaultKind kind = FaultKind::kRefusal;
  std::uint64_t number = 0;
  // Instead of failing, a listing ends there, a file ends there, or a file is empty: what a run in
  // which that fault happened is compared with.
  bool gently = false;
};

// What a run is not to see of the policy; nothing where a path is empty.
struct MissingPolicy {
  std::string directory = {};  // its entries from `firstName` on, in byte order, are hidden
  std::string firstName = {};
  std::string file = {};  // ends before this byte
  std::size_t bytes = 0;
};

}  // namespace SecPolicyFaults
