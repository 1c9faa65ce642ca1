// Graphviz, where it is installed.
#pragma once

#include <stdexcept>
#include <string>

namespace SecPolicyTool {

class GraphvizMissing : public std::runtime_error {
 public:
  GraphvizMissing()
      : std::runtime_error("Graphviz is not installed: there is no program \"dot\" in PATH") {}
};

// What Graphviz's program makes of `dot` in one of its output formats, for example "svg". No shell
// is involved. Not to be called in a process that has entered a host, which can start no program.
//
// Throws GraphvizMissing, std::runtime_error "Graphviz failed: " and what the program says (or
// "exit status N", "signal N" when it says nothing), and std::system_error when no process can be
// made.
std::string RunGraphviz(const std::string& dot, const std::string& format);

}  // namespace SecPolicyTool
