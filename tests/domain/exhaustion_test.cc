// Memory that runs out passes through the stage and the display; nothing stays open on any path.
#include "tests/domain/domain_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class ExhaustionTest : public DomainTest {
 protected:
  ExhaustionTest() {
    Domain("aDom", "-s openat grant\n-s close grant\n");
    Domain("bDom", "-s write grant\n");
  }

  void RunOutOfMemory(Operation operation, std::uint64_t call) {
    FailNothing();
    Fail(Fault{.operation = operation, .call = call, .kind = Fault::Kind::kOutOfMemory});
  }

  // How many descriptors the stage leaves open, which is none.
  std::string LeftOpenByLoad() {
    return Run([&] {
             const int before = LowestFreeDescriptor();
             try {
               SecPolicy::ZekAccessInterfaceImpl iface;
               SecPolicy::LoadPolicyDomains(PolicyPath("domains"), iface);
             } catch (const std::exception&) {
             }
             return std::to_string(LowestFreeDescriptor() - before);
           })
        .value;
  }
};

TEST_F(ExhaustionTest, TheStageEndsAtOnceAndLogsNothing) {
  struct Row {
    Operation operation;
    std::uint64_t call;
    std::size_t infos;  // phases that were over
  };
  const Row rows[] = {{Operation::kFindDomain, 2, 0},
                      {Operation::kValidateWord, 1, 1},
                      {Operation::kCheckCapabilityParams, 1, 2},
                      {Operation::kSetRule, 2, 3}};
  for (const Row& row : rows) {
    RunOutOfMemory(row.operation, row.call);
    const Outcome outcome = LoadDomains();
    EXPECT_EQ(outcome.error, "other: std::bad_alloc") << static_cast<int>(row.operation);
    EXPECT_THAT(outcome.Errors(), IsEmpty());
    EXPECT_EQ(outcome.Infos().size(), row.infos) << static_cast<int>(row.operation);
    EXPECT_THAT(outcome.Operations().back(), testing::EndsWith(" ! std::bad_alloc"));
  }
  EXPECT_THAT(RulesOf("aDom"), ElementsAre("-s openat grant"));
  EXPECT_THAT(RulesOf("bDom"), IsEmpty());
}

TEST_F(ExhaustionTest, TheDisplayEndsAtOnceAndLogsNothing) {
  EXPECT_EQ(LoadDomains().error, "");
  for (const Operation operation :
       {Operation::kMaxDomains, Operation::kDomainInfo, Operation::kGetRules}) {
    RunOutOfMemory(operation, 1);
    const Outcome outcome = RunWithInterface([](SecPolicy::ZekAccessInterfaceImpl& iface) {
      SecPolicy::DisplayPolicyDomains(iface, "");
    });
    EXPECT_EQ(outcome.error, "other: std::bad_alloc") << static_cast<int>(operation);
    EXPECT_THAT(outcome.Errors(), IsEmpty());
    EXPECT_THAT(outcome.Operations().back(), testing::EndsWith(" ! std::bad_alloc"));
  }
}

TEST_F(ExhaustionTest, NoDescriptorStaysOpen) {
  EXPECT_EQ(LeftOpenByLoad(), "0");
  for (const Operation operation : {Operation::kFindDomain, Operation::kValidateWord,
                                    Operation::kCheckCapabilityParams, Operation::kSetRule}) {
    FailNothing();
    Fail(operation);
    EXPECT_EQ(LeftOpenByLoad(), "0") << static_cast<int>(operation);
    RunOutOfMemory(operation, 1);
    EXPECT_EQ(LeftOpenByLoad(), "0") << static_cast<int>(operation);
  }
}

}  // namespace
}  // namespace SecPolicyTest
