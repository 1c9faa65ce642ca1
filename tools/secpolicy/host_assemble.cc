// secpolicy host assemble DIR
#include <iostream>
#include <memory>

#include "host/image/assemble.h"
#include "host/image/host_directory.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

ExitStatus AssembleHost(const std::string& dir) {
  const StandIn::AssembleReport report = StandIn::Assemble(StandIn::HostDirectory(dir));
  for (const auto& tardisk : report.tardisks) {
    std::cout << tardisk.name << ": " << tardisk.entries << " entries\n";
  }
  std::cout << report.tardisks.size() << " tardisks, " << report.entries << " entries\n";
  return kDone;
}

}  // namespace

CommandLine HostAssembleVerb() {
  const auto dir = std::make_shared<std::string>();
  return {.name = "assemble",
          .description =
              "Unpack a host's tardisks into its root file system, and start its kernel anew",
          .operands = {HostOperand(*dir, "The host directory")},
          .run = [dir] { return AssembleHost(*dir); }};
}

}  // namespace SecPolicyTool
