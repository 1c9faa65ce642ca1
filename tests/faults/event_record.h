// What a run does, in the order in which it does it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace SecPolicyFaults {

enum class EventKind : std::uint8_t {
  kOperation,  // on the module, as a trace names it
  kRefused,    // the operation ended with an exception; its name again
  kCall,       // a trapped system call: its name and path or number
  kCallEnd,
  kFile,  // a call for a file or a directory
  kInfo,  // to the system log
  kError,
  kEnding,   // how the scenario ended
  kFinding,  // what the run itself found to be wrong
  kState,    // what the module holds at the end
};

struct Event {
  EventKind kind = EventKind::kOperation;
  std::uint64_t allocations = 0;  // made before it
  std::string text;
};

// Lies in memory that a child shares with its parent, so that it outlives a process that was
// terminated; takes nothing from operator new.
class EventRecord {
 public:
  EventRecord();
  EventRecord(const EventRecord&) = delete;
  EventRecord& operator=(const EventRecord&) = delete;

  void Clear() noexcept;
  void Add(EventKind kind, std::uint64_t allocations, std::string_view text) noexcept;

  [[nodiscard]] std::vector<Event> Events() const;

 private:
  struct Header {
    EventKind kind;
    std::uint64_t allocations;
    std::size_t size;
  };

  std::size_t* used_;
  char* bytes_;
};

// Text that is kept in the same way.
class TextRecord {
 public:
  TextRecord();
  TextRecord(const TextRecord&) = delete;
  TextRecord& operator=(const TextRecord&) = delete;

  void Clear() noexcept { *used_ = 0; }
  void Add(std::string_view text) noexcept;
  [[nodiscard]] std::string Text() const { return {bytes_, *used_}; }

 private:
  std::size_t* used_;
  char* bytes_;
};

}  // namespace SecPolicyFaults
