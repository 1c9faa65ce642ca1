// The refusal of an operation by the security module.
#pragma once

#include <stdexcept>
#include <string>

namespace StandIn {

// Thrown by every operation of the module that is refused. `Number()` is the errno by which a
// kernel would answer (ENOSPC, EEXIST, ENOENT, EBUSY, ESRCH, EPERM, EINVAL...), `what()` a
// complete text for a person.
class ModuleError : public std::runtime_error {
 public:
  ModuleError(int number, const std::string& text) : std::runtime_error(text), number_(number) {}

  // errno; 0 stands for a refusal that names none, which only an injected fault makes.
  [[nodiscard]] int Number() const noexcept { return number_; }

 private:
  int number_;
};

}  // namespace StandIn
