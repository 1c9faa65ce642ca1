// secpolicy host assemble [--wait SECONDS] [--trust-other-writers] DIR
#include <iostream>
#include <memory>

#include "host/root/assemble.h"
#include "host/state/host_directory.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

struct AssembleArguments {
  std::string host;
  StandIn::ChangeOptions changes;
};

ExitStatus AssembleHost(const AssembleArguments& arguments) {
  StandIn::HostDirectory host(arguments.host);
  host.SetChanges(arguments.changes);
  const StandIn::AssembleReport report = StandIn::Assemble(host);
  for (const auto& tardisk : report.tardisks) {
    PrintLine(std::cout, tardisk.name + ": " + std::to_string(tardisk.entries) + " entries");
  }
  std::cout << report.tardisks.size() << " tardisks, " << report.entries << " entries\n";
  return kDone;
}

}  // namespace

CommandLine HostAssembleVerb() {
  const auto arguments = std::make_shared<AssembleArguments>();
  CommandLine verb{
      .name = "assemble",
      .description =
          "Unpack a host's tardisks into its root file system, and start its kernel anew",
      .operands = {HostOperand(arguments->host, "The host directory")},
      .run = [arguments] { return AssembleHost(*arguments); }};
  AddChangeOptions(verb, arguments->changes);
  return verb;
}

}  // namespace SecPolicyTool
