// Refusals on demand, and how they are written.
#include "host/trace/fault_plan.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <new>
#include <stdexcept>

namespace StandIn {
namespace {

using testing::ElementsAre;

TEST(ParseFaultTest, OperationAloneIsItsFirstCall) {
  const Fault fault = ParseFault("create-domain");
  EXPECT_EQ(fault.operation, Operation::kCreateDomain);
  EXPECT_EQ(fault.call, 1u);
  EXPECT_EQ(fault.kind, Fault::Kind::kRefusal);
  EXPECT_EQ(fault.number, EIO);
  EXPECT_EQ(fault.status, std::nullopt);
}

TEST(ParseFaultTest, NumberSelectsTheCall) {
  struct Row {
    const char* text;
    std::uint64_t call;
  };
  for (const Row& row : {Row{"set-rule:1", 1}, Row{"set-rule:12", 12}, Row{"set-rule:007", 7},
                         Row{"set-rule:18446744073709551615", 18446744073709551615u}}) {
    EXPECT_EQ(ParseFault(row.text).operation, Operation::kSetRule) << row.text;
    EXPECT_EQ(ParseFault(row.text).call, row.call) << row.text;
  }
}

TEST(ParseFaultTest, WhatIsNoFaultIsNamed) {
  struct Row {
    const char* text;
    const char* problem;
  };
  for (const Row& row : {Row{"", "no kernel operation is named \"\""},
                         Row{"frob", "no kernel operation is named \"frob\""},
                         Row{"frob:2", "no kernel operation is named \"frob\""},
                         Row{"Set-rule", "no kernel operation is named \"Set-rule\""},
                         Row{":1", "no kernel operation is named \"\""},
                         Row{"set-rule:", "not the number of a call: \"\""},
                         Row{"set-rule:0", "not the number of a call: \"0\""},
                         Row{"set-rule:-1", "not the number of a call: \"-1\""},
                         Row{"set-rule:+1", "not the number of a call: \"+1\""},
                         Row{"set-rule: 1", "not the number of a call: \" 1\""},
                         Row{"set-rule:1x", "not the number of a call: \"1x\""},
                         Row{"set-rule:1:2", "not the number of a call: \"1:2\""},
                         Row{"set-rule:0x1", "not the number of a call: \"0x1\""},
                         Row{"set-rule:18446744073709551616",
                             "not the number of a call: \"18446744073709551616\""}}) {
    std::string problem = "(none)";
    try {
      ParseFault(row.text);
    } catch (const std::invalid_argument& wrong) {
      problem = wrong.what();
    }
    EXPECT_EQ(problem, row.problem) << row.text;
  }
}

class FaultPlanTest : public testing::Test {
 protected:
  FaultPlanTest() { point_.Add(plan_); }

  // How a call ended: "done", or what it was refused with. It is counted when it is carried out.
  std::string Call(Operation operation) try {
    point_.Pass(operation, kNoWords, [&] { ++carriedOut_; });
    return "done";
  } catch (const InjectedRefusal& refusal) {
    return std::to_string(refusal.Number()) + " " + refusal.what();
  } catch (const std::bad_alloc&) {
    return "out of memory";
  }

  std::vector<std::string> Calls(Operation operation, int count) {
    std::vector<std::string> answers;
    for (int i = 0; i < count; ++i) answers.push_back(Call(operation));
    return answers;
  }

  FaultPlan plan_;
  OperationPoint point_;
  int carriedOut_ = 0;
};

TEST_F(FaultPlanTest, OnlyTheChosenCallIsRefused) {
  plan_.Add({.operation = Operation::kSetRule, .call = 2, .number = ENOSPC});
  EXPECT_THAT(Calls(Operation::kSetRule, 3),
              ElementsAre("done", "28 refused on request: set-rule, call 2", "done"));
  EXPECT_EQ(carriedOut_, 2);
}

TEST_F(FaultPlanTest, OperationsAreCountedEachForItself) {
  plan_.Add({.operation = Operation::kSetRule, .call = 2, .number = EIO});
  EXPECT_EQ(Call(Operation::kSetRule), "done");
  EXPECT_THAT(Calls(Operation::kGetRules, 3), ElementsAre("done", "done", "done"));
  EXPECT_EQ(Call(Operation::kSetRule), "5 refused on request: set-rule, call 2");
}

TEST_F(FaultPlanTest, SeveralFaultsOfOneOperation) {
  plan_.Add({.operation = Operation::kWords, .call = 3, .number = EPERM});
  plan_.Add({.operation = Operation::kWords, .call = 1, .number = EIO});
  EXPECT_THAT(Calls(Operation::kWords, 4),
              ElementsAre("5 refused on request: words, call 1", "done",
                          "1 refused on request: words, call 3", "done"));
}

TEST_F(FaultPlanTest, FaultMayBeOfMemory) {
  plan_.Add({.operation = Operation::kWords, .kind = Fault::Kind::kOutOfMemory});
  EXPECT_THAT(Calls(Operation::kWords, 2), ElementsAre("out of memory", "done"));
  EXPECT_EQ(carriedOut_, 1);
}

TEST_F(FaultPlanTest, RefusalMayNameNoErrno) {
  plan_.Add({.operation = Operation::kWords});
  EXPECT_EQ(Call(Operation::kWords), "0 refused on request: words, call 1");
}

TEST_F(FaultPlanTest, RefusalCarriesItsStatus) {
  plan_.Add({.operation = Operation::kWords, .status = 0x0bad011f});
  try {
    point_.Pass(Operation::kWords, kNoWords, [] {});
    ADD_FAILURE() << "not refused";
  } catch (const InjectedRefusal& refusal) {
    EXPECT_EQ(refusal.Status(), 0x0bad011f);
  }
}

}  // namespace
}  // namespace StandIn
