// secpolicy host init DIR
#include <iostream>
#include <memory>

#include "host/image/host_directory.h"
#include "host/module/description_json.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

void AddHostInit(CLI::App& app, ExitStatus&) {
  CLI::App* verb = app.add_subcommand("init", "Make a host directory with the default description");
  const auto dir = std::make_shared<std::string>();
  verb->add_option("DIR", *dir, "The directory to make")->type_name("DIR")->required();
  verb->callback([dir] {
    StandIn::HostDirectory::Create(*dir, StandIn::DefaultDescriptionText());
    std::cerr << "Made the host directory " + *dir + ". Put its tardisks into " + *dir +
                     "/tardisks, then run: secpolicy host assemble " + *dir + "\n";
  });
}

}  // namespace SecPolicyTool
