// secpolicy host init DIR
#include <iostream>
#include <memory>

#include "host/module/description_json.h"
#include "host/state/host_directory.h"
#include "tools/policy/terminal.h"
#include "tools/secpolicy/host_option.h"
#include "tools/secpolicy/verbs.h"

namespace SecPolicyTool {

namespace {

ExitStatus MakeHost(const std::string& dir) {
  StandIn::HostDirectory::Create(dir, StandIn::DefaultDescriptionText());
  PrintLine(std::cerr, "Made the host directory " + dir + ". Put its tardisks into " + dir +
                           "/tardisks, then run: secpolicy host assemble " + dir);
  return kDone;
}

}  // namespace

CommandLine HostInitVerb() {
  const auto dir = std::make_shared<std::string>();
  return {.name = "init",
          .description = "Make a host directory with the default description",
          .operands = {HostOperand(*dir, "The directory to make")},
          .run = [dir] { return MakeHost(*dir); }};
}

}  // namespace SecPolicyTool
