// The rules of one domain and type, by themselves.
#include "host/module/rule_table.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace StandIn {
namespace {

using testing::ElementsAre;

constexpr DomainId kStays = 8;
constexpr DomainId kGoes = 7;

Rule To(DomainId target, const std::string& label) {
  return {1, {label, "appDom", "exec"}, target, Decision::kGrant};
}

std::vector<std::string> LabelsIn(const RuleTable& table) {
  std::vector<std::string> labels;
  for (const Rule& rule : table.Rules()) labels.push_back(rule.words[0]);
  return labels;
}

TEST(RuleTable, WordsThatWereDroppedComeLastWhenTheyAreSetAgain) {
  RuleTable table;
  table.Set(To(kGoes, "a"));
  table.Set(To(kStays, "b"));
  table.DropTarget(kGoes);
  EXPECT_FALSE(table.Holds({"a", "appDom", "exec"}));
  EXPECT_EQ(table.Set(To(kStays, "a")), std::nullopt);
  EXPECT_THAT(LabelsIn(table), ElementsAre("b", "a"));
  EXPECT_EQ(table.Size(), 2U);
}

TEST(RuleTable, ATargetIsGivenBackByWhatTakesItsPlace) {
  RuleTable table;
  EXPECT_EQ(table.Set(To(kGoes, "a")), std::nullopt);
  EXPECT_EQ(table.Set(To(kStays, "a")), kGoes);
  EXPECT_EQ(table.Set(To(kStays, "a")), kStays);
  table.DropTarget(kGoes);
  EXPECT_THAT(LabelsIn(table), ElementsAre("a"));
}

// As where domains come and go at run time, for as long as a host runs.
TEST(RuleTable, RulesThatComeAndGoLeaveTheOthersInTheirOrder) {
  RuleTable table;
  table.Set(To(kStays, "first"));
  for (int round = 0; round < 20; ++round) {
    for (int i = 0; i < 300; ++i) table.Set(To(kGoes, "gone" + std::to_string(i)));
    if (round == 7) table.Set(To(kStays, "second"));
    table.DropTarget(kGoes);
    ASSERT_EQ(table.Size(), round < 7 ? 1U : 2U);
  }
  table.Set(To(kStays, "third"));
  EXPECT_THAT(LabelsIn(table), ElementsAre("first", "second", "third"));
  EXPECT_TRUE(table.Holds({"second", "appDom", "exec"}));
  EXPECT_FALSE(table.Holds({"gone0", "appDom", "exec"}));
  std::vector<DomainId> targets;
  table.ForEachTarget([&](DomainId target) { targets.push_back(target); });
  EXPECT_THAT(targets, ElementsAre(kStays, kStays, kStays));
}

}  // namespace
}  // namespace StandIn
