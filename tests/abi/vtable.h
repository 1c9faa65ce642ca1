// Looks into the tables of virtual functions, which lie as the Itanium C++ ABI says.
#pragma once

#include <cstddef>
#include <cstring>

namespace SecPolicyTest {

using VirtualFunction = void (*)(void*);

// The function's place in the table of the class that declares it, from 0: what a caller's code
// was compiled with. `function` must be virtual.
template <typename Member>
[[nodiscard]] std::ptrdiff_t SlotOf(Member function) {
  struct {
    std::ptrdiff_t offset;
    std::ptrdiff_t adjustment;
  } pointer;
  static_assert(sizeof(pointer) == sizeof(function));
  std::memcpy(&pointer, &function, sizeof(pointer));
#if defined(__aarch64__)
  // The lowest bit of an address may belong to an instruction: the adjustment has the mark.
  const bool isVirtual = (pointer.adjustment & 1) != 0;
  const std::ptrdiff_t offset = pointer.offset;
#else
  const bool isVirtual = (pointer.offset & 1) != 0;
  const std::ptrdiff_t offset = pointer.offset - 1;
#endif
  return isVirtual ? offset / static_cast<std::ptrdiff_t>(sizeof(void*)) : -1;
}

// Calls what stands in the slot of the object's table, as a function without arguments. The
// compiler knows no such call, so it must not check it.
__attribute__((no_sanitize("undefined"))) inline void CallSlot(void* object, std::size_t slot) {
  VirtualFunction* table = nullptr;
  std::memcpy(&table, object, sizeof(table));
  table[slot](object);
}

}  // namespace SecPolicyTest
