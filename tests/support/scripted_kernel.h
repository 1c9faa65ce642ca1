// A kernel that answers as a test says and remembers the registers.
#pragma once

#include <array>
#include <csignal>
#include <cstdint>
#include <functional>
#include <vector>

namespace SecPolicyTest {

// What a call leaves in its two result registers.
struct KernelAnswer {
  long status = 0;
  long error = 0;
};

// A trapped call as the kernel sees it.
struct SeenCall {
  long number = 0;
  std::array<std::uint64_t, 6> arguments{};

  // An argument that is an address of this process.
  template <typename Object>
  [[nodiscard]] Object* At(std::size_t index) const {
    return reinterpret_cast<Object*>(arguments[index]);
  }
};

// Answers the private calls and the path option of prctl instead of the host, in a process that has
// entered one, as long as it lives. One at a time.
class ScriptedKernel {
 public:
  using Script = std::function<KernelAnswer(const SeenCall&)>;

  explicit ScriptedKernel(Script script);
  // Answers every call alike.
  explicit ScriptedKernel(KernelAnswer answer)
      : ScriptedKernel([answer](const SeenCall&) { return answer; }) {}
  ~ScriptedKernel();
  ScriptedKernel(const ScriptedKernel&) = delete;
  ScriptedKernel& operator=(const ScriptedKernel&) = delete;

  [[nodiscard]] const std::vector<SeenCall>& Calls() const noexcept { return calls_; }

 private:
  static void OnTrap(int, siginfo_t*, void* context);

  static ScriptedKernel* current_;
  Script script_;
  std::vector<SeenCall> calls_;
  struct sigaction host_ {};
};

}  // namespace SecPolicyTest
