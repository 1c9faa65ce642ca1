#include <csignal>
#include <exception>
#include <iostream>

#include "tools/policy/output.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

CommandLine HostVerbs() {
  return {.name = "host",
          .description = "Make, assemble and inspect host directories",
          .verbs = {HostInitVerb(), HostAssembleVerb(), HostInfoVerb()}};
}

ExitStatus Run(int argc, char** argv) {
  CommandLine line{
      .name = "secpolicy",
      .description = "Writes, checks and loads a host's security policy.",
      .footer =
          "Exit status: 0 done, or yes; 1 the policy or the request failed, or no; 2 wrong "
          "usage;\n3 the load was terminated because a domain that the host needs is "
          "missing.",
      .version = std::string("secpolicy ") + SECPOLICY_VERSION,
      .verbs = {LoadVerb(), ShowVerb(), CheckVerb(), DiffVerb(), SearchVerb(), MayVerb(), WhoVerb(),
                TestVerb(), GraphVerb(), PathsVerb(), ReportVerb(), DigestVerb(), LabelVerb(),
                DomainVerb(), FilesVerb(), HostVerbs()}};
  line.verbs.push_back(CompletionVerb(line));
  const ExitStatus status = RunCommandLine(line, argc, argv);
  FlushOutput();
  return status;
}

}  // namespace

}  // namespace SecPolicyTool

int main(int argc, char** argv) {
  // A write beyond the limit of file sizes fails and is reported, as one on a full disk is.
  std::signal(SIGXFSZ, SIG_IGN);
  const SecPolicyTool::TerminalOutput output;
  try {
    return SecPolicyTool::Run(argc, argv);
  } catch (const std::exception& failure) {
    SecPolicyTool::ReportError(SecPolicyTool::MessageOf(failure));
    return SecPolicyTool::kFailed;
  }
}
