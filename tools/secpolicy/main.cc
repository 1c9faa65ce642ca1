#include <exception>
#include <iostream>

#include "tools/policy/output.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

void AddVerbs(CLI::App& app, ExitStatus& status) {
  app.require_subcommand(1);
  app.set_version_flag("--version", std::string("secpolicy ") + SECPOLICY_VERSION);
  app.footer(
      "Exit status: 0 done, or yes; 1 the policy or the request failed, or no; 2 wrong usage;\n"
      "3 the load was terminated because a domain that the host needs is missing.");
  AddLoad(app, status);
  AddShow(app, status);
  AddCheck(app, status);
  AddDiff(app, status);
  AddSearch(app, status);
  AddMay(app, status);
  AddWho(app, status);
  AddTest(app, status);
  AddGraph(app, status);
  AddPaths(app, status);
  AddReport(app, status);
  AddDigest(app, status);
  AddLabel(app, status);
  AddDomain(app, status);
  AddFiles(app, status);
  CLI::App* host = app.add_subcommand("host", "Make, assemble and inspect host directories");
  host->require_subcommand(1);
  AddHostInit(*host, status);
  AddHostAssemble(*host, status);
  AddHostInfo(*host, status);
  AddCompletion(app, status);
}

ExitStatus Run(int argc, char** argv) {
  ExitStatus status = kDone;
  CLI::App app("Writes, checks and loads a host's security policy.", "secpolicy");
  AddVerbs(app, status);
  try {
    app.parse(argc, argv);
  } catch (const CLI::ParseError& outcome) {
    // Help and version arrive as errors too; those have exit code 0.
    if (app.exit(outcome) != 0) return kUsage;
  }
  FlushOutput();
  return status;
}

}  // namespace

}  // namespace SecPolicyTool

int main(int argc, char** argv) try {
  return SecPolicyTool::Run(argc, argv);
} catch (const std::exception& failure) {
  SecPolicyTool::ReportError(failure.what());
  return SecPolicyTool::kFailed;
}
