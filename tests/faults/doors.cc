#include "tests/faults/doors.h"

#include <syslog.h>

#include <algorithm>
#include <cstring>
#include <iostream>
#include <limits>
#include <streambuf>

#include "tests/support/counted_memory.h"
#include "tests/support/system_log.h"

namespace SecPolicyFaults {

using SecPolicyTest::Allocations;
using SecPolicyTest::FailAllocation;
using SecPolicyTest::FailNoAllocation;
using SecPolicyTest::Shortage;

namespace {

Records* records = nullptr;
bool watched = false;
int insideKernel = 0;
const Fault* fault = nullptr;
const MissingPolicy* missing = nullptr;
bool hasHidden = false;
std::array<std::uint64_t, kDoors> passed{};

// Hands what is printed on to a record.
class RecordBuffer final : public std::streambuf {
 public:
  explicit RecordBuffer(TextRecord& record) : record_(record) {}

 protected:
  int_type overflow(int_type character) override {
    const char text = traits_type::to_char_type(character);
    record_.Add({&text, 1});
    return character;
  }
  std::streamsize xsputn(const char* text, std::streamsize size) override {
    record_.Add({text, static_cast<std::size_t>(size)});
    return size;
  }

 private:
  TextRecord& record_;
};

void RecordMessage(int priority, const char* message) {
  Record(priority == LOG_INFO ? EventKind::kInfo : EventKind::kError, message);
}

void ArmMemory() {
  if (fault == nullptr || InfoOf(fault->kind).door != Door::kMemory) return FailNoAllocation();
  FailAllocation(fault->number,
                 fault->kind == FaultKind::kExhaustion ? Shortage::kLasting : Shortage::kOne);
}

}  // namespace

void Records::Clear() noexcept {
  events.Clear();
  out.Clear();
  err.Clear();
}

void Watch(Records& to) {
  records = &to;
  // For the life of the process: its streams are flushed at the very end.
  std::cout.rdbuf(new RecordBuffer(to.out));
  std::cerr.rdbuf(new RecordBuffer(to.err));
  SecPolicyTest::CaptureSystemLog(RecordMessage);
}

Watching::Watching(const Fault* what, const MissingPolicy* unseen) {
  fault = what;
  missing = unseen;
  hasHidden = false;
  passed.fill(0);
  watched = true;
  ArmMemory();
}

Watching::~Watching() {
  passed[static_cast<std::size_t>(Door::kMemory)] = Allocations();
  FailNoAllocation();
  watched = false;
}

InsideKernel::InsideKernel() noexcept { ++insideKernel; }
InsideKernel::~InsideKernel() { --insideKernel; }

bool IsWatched() noexcept { return watched && insideKernel == 0; }

std::uint64_t Passed(Door door) noexcept { return passed[static_cast<std::size_t>(door)]; }

Verdict Pass(Door door) noexcept {
  if (!watched || (insideKernel > 0 && door != Door::kOperation)) return Verdict::kPass;
  const std::uint64_t number = passed[static_cast<std::size_t>(door)]++;
  if (fault == nullptr || InfoOf(fault->kind).door != door || fault->number != number) {
    return Verdict::kPass;
  }
  return fault->gently ? Verdict::kFailGently : Verdict::kFail;
}

FaultKind KindOfFault() noexcept { return fault->kind; }

void Record(EventKind kind, std::string_view text) noexcept {
  if (records != nullptr) records->events.Add(kind, Allocations(), text);
}

void Record(EventKind kind, std::string_view what, std::string_view path) noexcept {
  std::array<char, 4400> text{};  // the longest path and more
  std::size_t size = 0;
  for (const std::string_view part : {what, std::string_view(" "), path}) {
    const std::size_t fitting = std::min(part.size(), text.size() - size);
    std::memcpy(text.data() + size, part.data(), fitting);
    size += fitting;
  }
  Record(kind, {text.data(), size});
}

bool IsHiding(std::string_view directory) noexcept {
  const bool hides = !hasHidden && missing != nullptr && directory == missing->directory;
  hasHidden |= hides;
  return hides;
}

bool IsSeen(std::string_view name) noexcept { return name < missing->firstName; }

std::size_t SeenBytes(std::string_view file) noexcept {
  const bool isWhole = missing == nullptr || file != missing->file;
  return isWhole ? std::numeric_limits<std::size_t>::max() : missing->bytes;
}

}  // namespace SecPolicyFaults
