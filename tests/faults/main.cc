// Fails each thing that can fail, one at a time, and compares what comes with what is due.
#include <CLI/CLI.hpp>
#include <iostream>

#include "tests/faults/campaign.h"
#include "tests/faults/fault.h"

namespace {

using namespace SecPolicyFaults;

std::vector<std::string> ScenarioNames() {
  std::vector<std::string> names;
  for (const Scenario& scenario : AllScenarios()) names.push_back(scenario.name);
  return names;
}

std::vector<std::string> FaultNames() {
  std::vector<std::string> names;
  for (const FaultInfo& fault : kFaults) names.emplace_back(fault.name);
  return names;
}

void PrintLists() {
  for (const std::string& name : ScenarioNames()) std::cout << "scenario " << name << "\n";
  for (const std::string& name : FaultNames()) std::cout << "fault " << name << "\n";
}

}  // namespace

int main(int argc, char** argv) {
  CLI::App app("Fails each thing that can fail in turn, and compares what comes with what is due");
  CampaignOptions options;
  std::uint64_t only = 0;
  bool isShort = false;
  bool isLong = false;
  bool list = false;
  app.add_option("--scenario", options.scenarios, "Only this scenario; may be given several times")
      ->check(CLI::IsMember(ScenarioNames()));
  app.add_option("--fault", options.faults, "Only this kind of fault; may be given several times")
      ->check(CLI::IsMember(FaultNames()));
  app.add_option("--stride", options.stride, "Only every so manieth call of each kind");
  const CLI::Option* single = app.add_option("--only", only, "Only the call of this number");
  app.add_flag("--short", isShort, "A sample of everything (the default)");
  app.add_flag("--long", isLong, "Every call, but of the example host's allocations a sample")
      ->excludes("--short");
  app.add_flag("--list", list, "Say what there is, and do nothing");
  CLI11_PARSE(app, argc, argv);
  if (list) {
    PrintLists();
    return 0;
  }
  if (*single) options.only = only;
  if (isLong) options.form = Form::kLong;
  return RunCampaign(options).unexplained == 0 ? 0 : 1;
}
