// What is written to standard output and standard error by way of the streams.
#pragma once

#include <iostream>
#include <sstream>
#include <string>

namespace SecPolicyTest {

// Keeps what goes through `stream` as long as this object lives.
class Captured {
 public:
  explicit Captured(std::ostream& stream) : stream_(stream), before_(stream.rdbuf(text_.rdbuf())) {}
  ~Captured() { stream_.rdbuf(before_); }
  Captured(const Captured&) = delete;
  Captured& operator=(const Captured&) = delete;

  [[nodiscard]] std::string Text() const { return text_.str(); }

 private:
  std::ostringstream text_;
  std::ostream& stream_;
  std::streambuf* before_;
};

}  // namespace SecPolicyTest
