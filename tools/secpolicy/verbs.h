// The verbs of the command, one file each.
#pragma once

#include <CLI/CLI.hpp>

namespace SecPolicyTool {

// How the command ends, for scripts.
enum ExitStatus : int {
  kDone = 0,
  kFailed = 1,      // the policy or the request failed
  kUsage = 2,       // the command line is wrong
  kTerminated = 3,  // the load was terminated: a domain that the host needs is missing
};

// Each adds its verb to `app`. The verb's callback does the work and stores how it ended in
// `status`; what it throws is reported by main and ends the command with kFailed.
void AddHostInit(CLI::App& app, ExitStatus& status);
void AddHostAssemble(CLI::App& app, ExitStatus& status);
void AddHostInfo(CLI::App& app, ExitStatus& status);
void AddLoad(CLI::App& app, ExitStatus& status);
void AddShow(CLI::App& app, ExitStatus& status);

}  // namespace SecPolicyTool
