// Memory that this process and its children share.
#pragma once

#include <sys/mman.h>

#include <new>
#include <stdexcept>

namespace CrashTest {

// One `Value`, made of zeros. It is to hold atomics and plain values only.
template <typename Value>
class Shared {
 public:
  Shared() {
    void* const memory =
        mmap(nullptr, sizeof(Value), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (memory == MAP_FAILED) throw std::runtime_error("no memory can be shared");
    value_ = new (memory) Value();
  }
  ~Shared() { munmap(value_, sizeof(Value)); }
  Shared(const Shared&) = delete;
  Shared& operator=(const Shared&) = delete;

  Value& operator*() const { return *value_; }
  Value* operator->() const { return value_; }

 private:
  Value* value_;
};

}  // namespace CrashTest
