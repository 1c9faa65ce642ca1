// Fails each thing that can fail, one at a time, and compares what comes with what is due.
#include <iostream>
#include <limits>

#include "tests/faults/campaign.h"
#include "tests/faults/fault.h"
#include "tools/command_line/command_line.h"

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

struct CampaignArguments {
  CampaignOptions options;
  bool isLong = false;
  bool isList = false;
};

SecPolicyTool::ExitStatus Run(const CampaignArguments& arguments) {
  if (arguments.isList) {
    PrintLists();
    return SecPolicyTool::kDone;
  }
  CampaignOptions options = arguments.options;
  if (arguments.isLong) options.form = Form::kLong;
  return RunCampaign(options).unexplained == 0 ? SecPolicyTool::kDone : SecPolicyTool::kFailed;
}

SecPolicyTool::Store IntoCallNumber(const std::function<void(std::uint64_t)>& use) {
  return [use](const std::string& text) {
    constexpr std::int64_t kMost = std::numeric_limits<std::int64_t>::max();
    use(static_cast<std::uint64_t>(SecPolicyTool::WholeNumber(text, 1, kMost)));
  };
}

SecPolicyTool::CommandLine Described(CampaignArguments& arguments) {
  using SecPolicyTool::Into;
  CampaignOptions& options = arguments.options;
  return {
      .name = "fault_campaign",
      .description = "Fail each operation that can fail, one at a time, and check the outcome",
      .options = {{.names = {"--scenario"},
                   .value = "NAME",
                   .description = "Run only this scenario; may be given several times",
                   .store = Into(options.scenarios),
                   .choices = ScenarioNames(),
                   .isRepeatable = true},
                  {.names = {"--fault"},
                   .value = "NAME",
                   .description = "Inject only this kind of fault; may be given several times",
                   .store = Into(options.faults),
                   .choices = FaultNames(),
                   .isRepeatable = true},
                  {.names = {"--stride"},
                   .value = "N",
                   .description = "Inject only into every N-th call of each kind",
                   .store = IntoCallNumber([&](std::uint64_t n) { options.stride = n; })},
                  {.names = {"--only"},
                   .value = "N",
                   .description = "Inject only into the N-th call",
                   .store = IntoCallNumber([&](std::uint64_t n) { options.only = n; })},
                  {.names = {"--short"},
                   .description = "Inject a sample of all faults (the default)",
                   .store = [](const std::string&) {},
                   .excludes = "--long"},
                  {.names = {"--long"},
                   .description =
                       "Inject into every call; of the example host's allocations, into a sample",
                   .store = Into(arguments.isLong)},
                  {.names = {"--list"},
                   .description = "List the scenarios and the kinds of faults",
                   .store = Into(arguments.isList)}},
      .run = [&arguments] { return Run(arguments); }};
}

}  // namespace

int main(int argc, char** argv) {
  CampaignArguments arguments;
  return SecPolicyTool::RunCommandLine(Described(arguments), argc, argv);
}
