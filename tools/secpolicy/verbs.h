// The verbs of the command, one file each.
#pragma once

#include <CLI/CLI.hpp>

#include "tools/policy/exit_status.h"

namespace SecPolicyTool {

// Each adds its verb to `app`. The verb's callback does the work and stores how it ended in
// `status`; what it throws is reported by main and ends the command with kFailed.
void AddCheck(CLI::App& app, ExitStatus& status);
void AddCompletion(CLI::App& app, ExitStatus& status);
void AddDiff(CLI::App& app, ExitStatus& status);
void AddDigest(CLI::App& app, ExitStatus& status);
void AddDomain(CLI::App& app, ExitStatus& status);
void AddFiles(CLI::App& app, ExitStatus& status);
void AddGraph(CLI::App& app, ExitStatus& status);
void AddHostAssemble(CLI::App& app, ExitStatus& status);
void AddHostInfo(CLI::App& app, ExitStatus& status);
void AddHostInit(CLI::App& app, ExitStatus& status);
void AddLabel(CLI::App& app, ExitStatus& status);
void AddLoad(CLI::App& app, ExitStatus& status);
void AddMay(CLI::App& app, ExitStatus& status);
void AddPaths(CLI::App& app, ExitStatus& status);
void AddReport(CLI::App& app, ExitStatus& status);
void AddSearch(CLI::App& app, ExitStatus& status);
void AddShow(CLI::App& app, ExitStatus& status);
void AddTest(CLI::App& app, ExitStatus& status);
void AddWho(CLI::App& app, ExitStatus& status);

}  // namespace SecPolicyTool
