#include "tests/host/gate/gate_fixture.h"

#include <sys/mman.h>

#include <cstdio>
#include <stdexcept>

#include "host/gate/gate.h"

namespace StandIn {

std::string AnswerText(long status, int number) {
  if (status == 0) return number == 0 ? "done" : "done, but an error value was set";
  const char* name = strerrorname_np(number);
  if (status < 0) return std::string("kernel: ") + name;
  char text[64];
  std::snprintf(text, sizeof text, "%#lx %s", static_cast<unsigned long>(status), name);
  return text;
}

std::string ResultText(long result) {
  return result < 0 ? strerrorname_np(errno) : std::to_string(result);
}

LastPage::LastPage()
    : begin_(static_cast<char*>(
          mmap(nullptr, 2 * kSize, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0))) {
  if (begin_ == MAP_FAILED || munmap(End(), kSize) != 0) {
    throw std::runtime_error("no memory could be mapped");
  }
}

LastPage::~LastPage() { munmap(begin_, kSize); }

char* LastPage::PutAtEnd(std::string_view bytes) {
  return static_cast<char*>(std::memcpy(End() - bytes.size(), bytes.data(), bytes.size()));
}

void LastPage::MakeReadOnly() { mprotect(begin_, kSize, PROT_READ); }

void GateTest::InChild(const std::function<void()>& body) {
  const pid_t child = StartChild(body);
  EXPECT_TRUE(ChildPassed(child));
}

void GateTest::BehindTheGate(const std::function<void()>& body) {
  InChild([&] {
    EnterGate();
    body();
  });
}

}  // namespace StandIn
