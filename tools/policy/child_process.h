// Work in a process of its own.
#pragma once

#include <functional>
#include <string>

namespace SecPolicyTool {

// Runs `work` in a forked child whose standard error is handed to `line`, line by line without its
// end, in this process and in order. Returns the child's wait status (see waitpid) once it has
// ended. While nothing is written, `tick` is called a few times a second. `work` returns the
// child's exit status; what it throws is reported as an error and makes that kFailed. Throws
// std::system_error when no child can be made.
int RunInChild(const std::function<int()>& work, const std::function<void(std::string& line)>& line,
               const std::function<void()>& tick);

}  // namespace SecPolicyTool
