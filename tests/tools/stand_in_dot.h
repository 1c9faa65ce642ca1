// A stand-in for Graphviz's program.
#pragma once

#include <cstdlib>
#include <filesystem>
#include <optional>
#include <string>

#include "tests/support/temporary_directory.h"

namespace SecPolicyTool {

// While it lives, PATH leads to a program "dot" of this shell script alone; to none when the script
// is empty.
class StandInDot {
 public:
  explicit StandInDot(const std::string& script) {
    if (const char* path = std::getenv("PATH")) path_ = path;
    if (!script.empty()) {
      StandIn::WriteBytes(bin_ / "dot", "#!/bin/sh\n" + script);
      std::filesystem::permissions(bin_ / "dot", std::filesystem::perms::owner_all);
    }
    setenv("PATH", bin_.Path().c_str(), 1);
  }
  ~StandInDot() { path_ ? setenv("PATH", path_->c_str(), 1) : unsetenv("PATH"); }
  StandInDot(const StandInDot&) = delete;
  StandInDot& operator=(const StandInDot&) = delete;

 private:
  StandIn::TemporaryDirectory bin_;
  std::optional<std::string> path_;
};

}  // namespace SecPolicyTool
