// The bar for what takes long.
#include "tools/policy/progress.h"

#include <gtest/gtest.h>

#include <sstream>

namespace SecPolicyTool {
namespace {

using namespace std::chrono_literals;

class ProgressTest : public testing::Test {
 protected:
  [[nodiscard]] Progress Bar(std::size_t total, bool isTerminal = true) {
    return Progress("Working", total, out_, isTerminal, [this] { return now_; });
  }

  std::chrono::steady_clock::time_point now_{};
  std::ostringstream out_;
};

TEST_F(ProgressTest, NothingIsDrawnInTheFirstSecond) {
  Progress bar = Bar(10);
  now_ += 999ms;
  bar.Step();
  EXPECT_EQ(out_.str(), "");
}

TEST_F(ProgressTest, NothingIsDrawnWhereThereIsNoTerminal) {
  Progress bar = Bar(10, false);
  now_ += 5s;
  bar.Step();
  bar.Clear();
  EXPECT_EQ(out_.str(), "");
}

TEST_F(ProgressTest, BarGrowsWithTheSteps) {
  Progress bar = Bar(4);
  bar.Step();
  now_ += 1s;
  bar.Step();
  EXPECT_EQ(out_.str(), "\r\x1b[KWorking [###############...............] 50 %");
}

TEST_F(ProgressTest, BarEndsWhenThereAreMoreSteps) {
  Progress bar = Bar(1);
  bar.Step();
  now_ += 1s;
  bar.Step();
  EXPECT_EQ(out_.str(), "\r\x1b[KWorking [" + std::string(30, '#') + "] 100 %");
}

TEST_F(ProgressTest, SecondsAreShownWhereNobodyKnowsTheSteps) {
  Progress bar = Bar(0);
  now_ += 2500ms;
  bar.Tick();
  EXPECT_EQ(out_.str(), "\r\x1b[KWorking ... 2 s");
}

TEST_F(ProgressTest, IsNotDrawnForEachStep) {
  Progress bar = Bar(0);
  now_ += 1s;
  bar.Tick();
  const std::string drawn = out_.str();
  now_ += 99ms;
  bar.Tick();
  EXPECT_EQ(out_.str(), drawn);
  now_ += 1ms;
  bar.Tick();
  EXPECT_NE(out_.str(), drawn);
}

TEST_F(ProgressTest, IsErasedAtItsEnd) {
  {
    Progress bar = Bar(0);
    now_ += 1s;
    bar.Tick();
    out_.str("");
  }
  EXPECT_EQ(out_.str(), "\r\x1b[K");
}

TEST_F(ProgressTest, WhatIsNotDrawnIsNotErased) {
  { const Progress bar = Bar(0); }
  EXPECT_EQ(out_.str(), "");
}

}  // namespace
}  // namespace SecPolicyTool
