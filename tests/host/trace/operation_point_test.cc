// The point that every operation passes, and the names of the operations.
#include "host/trace/operation_point.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <set>
#include <stdexcept>

namespace StandIn {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

// Writes down what passes.
class Witness final : public OperationHook {
 public:
  Witness(std::string name, std::vector<std::string>& seen) : name_(std::move(name)), seen_(seen) {}

  void Around(const OperationCall& call, const Callable<void>& proceed) override {
    seen_.push_back(name_ + " before " + std::string(InfoOf(call.operation).name));
    proceed();
    seen_.push_back(name_ + " after");
  }

 private:
  std::string name_;
  std::vector<std::string>& seen_;
};

class OperationPointTest : public testing::Test {
 protected:
  std::vector<std::string> seen_;
  Witness outer_{"outer", seen_};
  Witness inner_{"inner", seen_};
  OperationPoint point_;
};

TEST_F(OperationPointTest, FirstHookIsTheOutermost) {
  point_.Add(outer_);
  point_.Add(inner_);
  point_.Pass(Operation::kFindDomain, kNoWords, [&] { seen_.push_back("action"); });
  EXPECT_THAT(seen_, ElementsAre("outer before find-domain", "inner before find-domain", "action",
                                 "inner after", "outer after"));
}

TEST_F(OperationPointTest, WithoutHooksTheActionRuns) {
  EXPECT_EQ(point_.Pass(Operation::kMaxDomains, kNoWords, [] { return 7; }), 7);
}

TEST_F(OperationPointTest, ResultIsHandedOnWithoutACopy) {
  point_.Add(outer_);
  const auto make = [] { return std::make_unique<int>(7); };
  EXPECT_EQ(*point_.Pass(Operation::kWords, kNoWords, make), 7);
}

TEST_F(OperationPointTest, RefusalPassesEveryHook) {
  point_.Add(outer_);
  point_.Add(inner_);
  const auto refuse = []() -> int { throw std::runtime_error("no"); };
  EXPECT_THROW(point_.Pass(Operation::kWords, kNoWords, refuse), std::runtime_error);
  EXPECT_THAT(seen_, ElementsAre("outer before words", "inner before words"));
}

// Refuses everything.
class Refuser final : public OperationHook {
 public:
  void Around(const OperationCall&, const Callable<void>&) override {
    throw std::runtime_error("no");
  }
};

TEST_F(OperationPointTest, RefusedByAHookTheActionDoesNotRun) {
  Refuser refuser;
  point_.Add(refuser);
  point_.Add(inner_);
  EXPECT_THROW(point_.Pass(Operation::kWords, kNoWords, [&] { seen_.push_back("action"); }),
               std::runtime_error);
  EXPECT_THAT(seen_, IsEmpty());
}

TEST_F(OperationPointTest, WordsAreNotPutTogetherForNobody) {
  point_.Add(outer_);
  int asked = 0;
  const auto words = [&] {
    ++asked;
    return std::string("words");
  };
  point_.Pass(Operation::kWords, words, [] {});
  EXPECT_EQ(asked, 0);
}

TEST(OperationTest, IsFoundByItsName) {
  std::set<std::string_view> names;
  for (std::size_t i = 0; i < kOperations.size(); ++i) {
    const auto operation = static_cast<Operation>(i);
    EXPECT_TRUE(names.insert(InfoOf(operation).name).second) << InfoOf(operation).name;
    EXPECT_EQ(FindOperation(InfoOf(operation).name), operation) << InfoOf(operation).name;
  }
  EXPECT_EQ(names.size(), 40u);
}

TEST(OperationTest, NothingElseIsFound) {
  for (const char* name : {"", "find", "find-domain ", "Find-domain", "find-domain:1"}) {
    EXPECT_EQ(FindOperation(name), std::nullopt) << name;
  }
}

}  // namespace
}  // namespace StandIn
