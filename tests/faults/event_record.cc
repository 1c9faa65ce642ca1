#include "tests/faults/event_record.h"

#include <sys/mman.h>

#include <cstdlib>
#include <cstring>
#include <stdexcept>

namespace SecPolicyFaults {

namespace {

constexpr std::size_t kRoom = std::size_t{64} << 20;  // taken from the system as it is used
constexpr std::size_t kStart = 64;                    // behind the number of bytes used

void* SharedMemory() {
  void* const memory = mmap(nullptr, kRoom, PROT_READ | PROT_WRITE,
                            MAP_SHARED | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
  if (memory == MAP_FAILED) throw std::runtime_error("no memory to record events in");
  return memory;
}

// A record that overflows would hide what happened.
char* Take(std::size_t* used, char* bytes, std::size_t size) noexcept {
  if (*used + size > kRoom - kStart) std::abort();
  char* const place = bytes + *used;
  *used += size;
  return place;
}

}  // namespace

EventRecord::EventRecord()
    : used_(static_cast<std::size_t*>(SharedMemory())),
      bytes_(reinterpret_cast<char*>(used_) + kStart) {}

void EventRecord::Clear() noexcept { *used_ = 0; }

void EventRecord::Add(EventKind kind, std::uint64_t allocations, std::string_view text) noexcept {
  const Header header{kind, allocations, text.size()};
  char* const place = Take(used_, bytes_, sizeof header + text.size());
  std::memcpy(place, &header, sizeof header);
  std::memcpy(place + sizeof header, text.data(), text.size());
}

std::vector<Event> EventRecord::Events() const {
  std::vector<Event> events;
  for (const char* place = bytes_; place < bytes_ + *used_;) {
    Header header{};
    std::memcpy(&header, place, sizeof header);
    place += sizeof header;
    events.push_back({header.kind, header.allocations, {place, header.size}});
    place += header.size;
  }
  return events;
}

TextRecord::TextRecord()
    : used_(static_cast<std::size_t*>(SharedMemory())),
      bytes_(reinterpret_cast<char*>(used_) + kStart) {}

void TextRecord::Add(std::string_view text) noexcept {
  std::memcpy(Take(used_, bytes_, text.size()), text.data(), text.size());
}

}  // namespace SecPolicyFaults
