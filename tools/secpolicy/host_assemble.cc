// secpolicy host assemble DIR
#include <iostream>
#include <memory>

#include "host/image/assemble.h"
#include "host/image/host_directory.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

void AddHostAssemble(CLI::App& app, ExitStatus&) {
  CLI::App* verb = app.add_subcommand(
      "assemble", "Unpack a host's tardisks into its root file system, and start its kernel anew");
  const auto dir = std::make_shared<std::string>();
  verb->add_option("DIR", *dir, "The host directory")->type_name("DIR")->required();
  verb->callback([dir] {
    const StandIn::AssembleReport report = StandIn::Assemble(StandIn::HostDirectory(*dir));
    for (const auto& tardisk : report.tardisks) {
      std::cout << tardisk.name << ": " << tardisk.entries << " entries\n";
    }
    std::cout << report.tardisks.size() << " tardisks, " << report.entries << " entries\n";
  });
}

}  // namespace SecPolicyTool
