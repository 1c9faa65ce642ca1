// What ends a load at once: memory that runs out, and an interface that cannot be opened.
#include "tests/core/load_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;

class EndedLoadTest : public LoadTest {};

struct MemoryRunsOut {
  const char* where;
  Operation operation;
  std::uint64_t call;
  std::vector<std::string> installed;  // until then
};

const MemoryRunsOut kMemoryRunsOut[] = {
    {"objects read from the kernel", Operation::kWords, 1, {}},
    {"objects", Operation::kAddLabels, 2, {}},
    {"domain names", Operation::kFindDomain, 2, {kObjectsSet}},
    {"domain parse", Operation::kValidateWord, 1, {kObjectsSet}},
    {"constraints", Operation::kCheckCapabilityParams, 1, {kObjectsSet}},
    {"rules", Operation::kSetRule, 1, {kObjectsSet}},
    {"globalVMDom", Operation::kFindDomain, 4, {kObjectsSet, kDomainsSet}},
    {"its role", Operation::kSetGlobalVMDomain, 1, {kObjectsSet, kDomainsSet}},
    {"ioFilterDom", Operation::kFindDomain, 5, {kObjectsSet, kDomainsSet, kGlobalVMSet}},
    {"its role", Operation::kSetIoFilterDomain, 1, {kObjectsSet, kDomainsSet, kGlobalVMSet}},
    {"appDom", Operation::kFindDomain, 6, {kObjectsSet, kDomainsSet, kGlobalVMSet, kIoFilterSet}},
    {"tardisks",
     Operation::kTardiskLaunchDomain,
     1,
     {kObjectsSet, kDomainsSet, kGlobalVMSet, kIoFilterSet}},
    {"file label parse",
     Operation::kValidateWord,
     2,
     {kObjectsSet, kDomainsSet, kGlobalVMSet, kIoFilterSet, kTardisksSet}},
    {"file labels",
     Operation::kLookupLabel,
     1,
     {kObjectsSet, kDomainsSet, kGlobalVMSet, kIoFilterSet, kTardisksSet}},
};

TEST_F(EndedLoadTest, ExhaustedMemoryPassesThroughUnloggedFromEveryStage) {
  for (const MemoryRunsOut& row : kMemoryRunsOut) {
    SCOPED_TRACE(row.where);
    FailNothing();
    Fail(Fault{.operation = row.operation, .call = row.call, .kind = Fault::Kind::kOutOfMemory});
    const Outcome outcome = Load();
    EXPECT_EQ(outcome.error, "other: std::bad_alloc");
    EXPECT_EQ(outcome.err, "");
    EXPECT_THAT(outcome.Errors(), IsEmpty());
    EXPECT_EQ(Installed(outcome), row.installed);
    ExpectClosedInterface(outcome);
  }
}

TEST_F(EndedLoadTest, ExhaustedMemoryIsNotHiddenByAnEarlierFailure) {
  Policy("objects/bad", "one two\n");
  Fail(Fault{.operation = Operation::kLookupLabel, .kind = Fault::Kind::kOutOfMemory});
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.error, "other: std::bad_alloc");
  EXPECT_THAT(outcome.Errors(), Contains("Failure in object policy"));
}

TEST_F(EndedLoadTest, LeavesNoDescriptorOpen) {
  Fail(Fault{.operation = Operation::kLookupLabel, .kind = Fault::Kind::kOutOfMemory});
  const Outcome outcome = Run([&]() -> unsigned int {
    const int before = LowestFreeDescriptor();
    try {
      SecPolicy::LoadPolicy(PolicyDir());
    } catch (const std::bad_alloc&) {
      return static_cast<unsigned int>(LowestFreeDescriptor() - before);
    }
    return 999;
  });
  EXPECT_EQ(outcome.value, "0");
}

TEST_F(EndedLoadTest, InterfaceThatCannotBeOpenedEndsItBeforeAnythingIsLogged) {
  Fail(Operation::kOpenInterface);
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.error, "refused on request: open-interface, call 1");
  EXPECT_THAT(outcome.events, ElementsAre("kernel: open-interface ! " + outcome.error));
  EXPECT_EQ(outcome.err, "");
}

TEST(LoadOutsideAHostTest, SaysThatThereIsNone) {
  EXPECT_EQ(StandIn::MessageOf<Tavon::Lib::TavonException>([] { SecPolicy::LoadPolicy("/any"); }),
            "the kernel's security module cannot be reached: no host has been entered");
}

}  // namespace
}  // namespace SecPolicyTest
