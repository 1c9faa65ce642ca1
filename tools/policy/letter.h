// What a child process leaves behind for its parent.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>
#include <string_view>

#include "host/image/unique_fd.h"

namespace SecPolicyTool {

// A file without a name, made before the child is, in which the child leaves what it found. Not
// inherited by programs.
class Letter {
 public:
  // Throws std::system_error when there is no such file to be had.
  Letter();

  // Adds `bytes`. Throws std::system_error when there is no room for them.
  void WriteBytes(std::string_view bytes) const;
  // Everything that was written. Throws StandIn::HostError when it cannot be read.
  [[nodiscard]] std::string ReadBytes() const;

  // The same for JSON, whose strings may hold any bytes. One content a letter.
  void Write(const nlohmann::json& content) const;
  // Null when nothing was written. Throws nlohmann::json::exception when the child came to its end
  // half-way.
  [[nodiscard]] nlohmann::json Read() const;

  [[nodiscard]] int Descriptor() const { return fd_.Get(); }

 private:
  StandIn::UniqueFd fd_;
};

}  // namespace SecPolicyTool
