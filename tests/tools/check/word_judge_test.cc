// Which words a kernel takes, and what it costs to say which ones were meant.
#include "tools/check/word_judge.h"

#include "host/kernel/proc_processes.h"
#include "host/module/description_json.h"
#include "host/module/simulated_module.h"
#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {
namespace {

using StandIn::WordList;

class WordJudgeTest : public testing::Test {
 protected:
  // So many labels that it does not take long to have compared very many.
  static constexpr int kLabels = 4000;
  static constexpr int kEnough = 501;

  WordJudgeTest()
      : module_(StandIn::ReadDescription(StandIn::DefaultDescriptionText(), "host.json"),
                processes_),
        judge_(module_) {
    std::vector<std::string> labels{"conf"};
    for (int i = 1; i < kLabels; ++i) labels.push_back(std::string(90, 'l') + std::to_string(i));
    module_.AddLabels(labels, StandIn::LabelType::kObject);
  }

  std::string Refusal(const std::string& word, Effort effort) {
    return judge_.Refusal(WordList::kObjects, word, effort).value_or("taken");
  }

  StandIn::ProcProcesses processes_;
  StandIn::SimulatedModule module_;
  WordJudge judge_;
};

TEST_F(WordJudgeTest, NearestWordIsLookedForUntilItCostsTooMuch) {
  const std::string exact = "unknown object label \"cnof\" (nearest: conf)";
  EXPECT_EQ(Refusal("conf", Effort::kBounded), "taken");
  EXPECT_EQ(Refusal("cnof", Effort::kBounded), exact);
  for (int i = 0; i < kEnough; ++i) (void)Refusal("w" + std::to_string(i), Effort::kBounded);
  EXPECT_EQ(Refusal("cnf", Effort::kBounded), "unknown object label \"cnf\"");
  EXPECT_EQ(Refusal("cnf", Effort::kExact), "unknown object label \"cnf\" (nearest: conf)");
  // What was found out once is known.
  EXPECT_EQ(Refusal("cnof", Effort::kBounded), exact);
  EXPECT_EQ(Refusal("cnf", Effort::kBounded), "unknown object label \"cnf\" (nearest: conf)");
}

TEST_F(WordJudgeTest, SameHoldsForDomains) {
  for (int i = 0; i < 1000; ++i) {
    module_.CreateDomain(std::string(90, 'd') + std::to_string(i), StandIn::DomainOrigin::kPolicy);
  }
  EXPECT_EQ(judge_.HelpForDomain("rootDmo"), "did you mean \"rootDom\"?");
  for (int i = 0; i < 2000; ++i) (void)judge_.HelpForDomain("w" + std::to_string(i));
  EXPECT_EQ(judge_.HelpForDomain("rotDom"), "make a file domains/rotDom; it may be empty");
  EXPECT_EQ(judge_.HelpForDomain("rootDmo"), "did you mean \"rootDom\"?");
}

}  // namespace
}  // namespace SecPolicyTool
