// Calls to the kernel from inside a host.
#pragma once

#include <cerrno>
#include <cstdint>
#include <cstring>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "kernel/private_call.h"
#include "platform/private_calls.h"
#include "tests/support/child_process.h"
#include "tests/support/host_test.h"

namespace StandIn {

// The attribute that holds a file's label.
inline constexpr char kLabel[] = "olvane.security";

using ZekCtl::Kernel::PrivateCall;

// An answer as text: "done"; "0xbad0011 EEXIST" for a status and its error value; "kernel: ENOSYS"
// for the refusal of a kernel without a security module.
std::string AnswerText(long status, int number);

// Makes a private call and says how it ended.
template <typename... Arguments>
std::string Ask(PrivateCall call, Arguments... arguments) {
  errno = 0;
  const long status = SecPolicy::IssuePrivateCall(call, arguments...);
  return AnswerText(status, errno);
}

// What an ordinary call that has just returned `result` came to: that number, or the errno's name.
std::string ResultText(long result);

// The answers, in the order in which they were asked for.
inline std::string InTurn(const std::vector<std::string>& answers) {
  std::string text;
  for (const std::string& answer : answers) text += (text.empty() ? "" : ", ") + answer;
  return text;
}

// An address that is only a number.
inline void* Address(std::uint64_t number) { return reinterpret_cast<void*>(number); }

// A page of memory with nothing mapped behind it.
class LastPage {
 public:
  LastPage();
  ~LastPage();
  LastPage(const LastPage&) = delete;
  LastPage& operator=(const LastPage&) = delete;

  // Puts `bytes` so that memory ends with them; where they begin.
  char* PutAtEnd(std::string_view bytes);
  [[nodiscard]] char* Begin() const { return begin_; }
  [[nodiscard]] char* End() const { return begin_ + kSize; }  // not mapped
  void MakeReadOnly();

  static constexpr std::size_t kSize = 16384;

 private:
  char* begin_;
};

class GateTest : public SecPolicyTest::HostTest {
 protected:
  // Runs `body` in a process of its own that has entered the host; expectations in it count, and
  // what it does to the kernel is kept.
  void InHost(const std::function<void()>& body) {
    Assemble();
    InChild([&] {
      EnterHere();
      body();
    });
  }

  // The same in a process that is as this one.
  static void InChild(const std::function<void()>& body);

  // The same in a process that has the gate but no host.
  static void BehindTheGate(const std::function<void()>& body);
};

}  // namespace StandIn
