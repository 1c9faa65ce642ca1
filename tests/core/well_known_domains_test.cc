// The domains without which a load must not go on, and their ids.
#include <unistd.h>

#include <csignal>
#include <exception>
#include <ostream>
#include <stdexcept>

#include "tests/core/load_fixture.h"

namespace SecPolicyTest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::StartsWith;

struct MissingDomain {
  const char* name;
  const char* error;
  std::vector<std::string> roles;  // that the kernel was told of before the end
};

// How the list of tests names it.
void PrintTo(const MissingDomain& missing, std::ostream* to) { *to << missing.name; }

const MissingDomain kMissingDomains[] = {
    {"globalVMDom", "Failed to fetch domainID for global VM Domain", {}},
    {"ioFilterDom", "Failed to fetch domainID for IOFilter domain", {kGlobalVMSet}},
    {"appDom",
     "Failed to fetch domainID for default tar disk domain",
     {kGlobalVMSet, kIoFilterSet}},
};

// The three ids, as text.
std::string Ids() {
  return std::to_string(SecPolicy::GetGlobalVMDomain()) + " " +
         std::to_string(SecPolicy::GetIOFilterDomain()) + " " +
         std::to_string(SecPolicy::GetDefaultTardiskDomain());
}

class WellKnownDomainsTest : public LoadTest {
 protected:
  // A load with the ids behind it, whether it fails or not.
  Outcome IdsAfterLoad() {
    return Run([&] {
      try {
        SecPolicy::LoadPolicy(PolicyDir());
      } catch (const std::exception&) {
        return "failed: " + Ids();
      }
      return Ids();
    });
  }
};

class MissingDomainTest : public WellKnownDomainsTest,
                          public testing::WithParamInterface<MissingDomain> {
 protected:
  MissingDomainTest() { Remove(std::string("domains/") + GetParam().name); }

  // The roles, and everything of the stages behind the well-known domains.
  static std::vector<std::string> FromTheRolesOn(const Outcome& outcome) {
    return outcome.Operations({"set-global-vm-domain", "set-io-filter-domain",
                               "tardisk-launch-domain", "default-tardisk-label",
                               "default-tardisk-domain", "lookup-label", "set-file-label"});
  }
};

TEST_P(MissingDomainTest, EndsTheProcess) {
  EXPECT_EXIT((EnterHere(), SecPolicy::LoadPolicy(PolicyDir())), testing::KilledBySignal(SIGABRT),
              std::string("^Error: ") + GetParam().error + "\n");
}

TEST_P(MissingDomainTest, IsTheLastThingThatIsLoggedAndNoLaterStageRuns) {
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.signal, SIGABRT);
  EXPECT_THAT(outcome.err, StartsWith(AsLines({GetParam().error})));
  EXPECT_EQ(outcome.events.back(), std::string("error: Error: ") + GetParam().error);
  EXPECT_EQ(FromTheRolesOn(outcome), GetParam().roles);
}

TEST_P(MissingDomainTest, EndsTheProcessAlsoBehindAFailedStage) {
  // The failed stage's exception is dealt with by then, and not the one to be raised again.
  Remove("objects");
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.signal, SIGABRT);
  EXPECT_THAT(
      outcome.Errors(),
      ElementsAre("Unable to open policy directory " + PolicyPath("objects"), GetParam().error));
}

TEST_P(MissingDomainTest, RaisesTheCallersExceptionAgainInsideItsHandler) {
  const Outcome outcome = Run([&] {
    try {
      throw std::runtime_error("the caller's own");
    } catch (const std::exception&) {
      SecPolicy::LoadPolicy(PolicyDir());
    }
  });
  EXPECT_EQ(outcome.error, "other: the caller's own");
  EXPECT_THAT(outcome.Errors(), ElementsAre(GetParam().error));
  EXPECT_EQ(FromTheRolesOn(outcome), GetParam().roles);
  ExpectClosedInterface(outcome);
}

INSTANTIATE_TEST_SUITE_P(Names, MissingDomainTest, testing::ValuesIn(kMissingDomains),
                         [](const auto& param) { return std::string(param.param.name); });

TEST_F(WellKnownDomainsTest, MissingOneRunsTheTerminateHandlerOfTheProgram) {
  Remove("domains/appDom");
  const Outcome outcome = Run([&] {
    std::set_terminate([] {
      dprintf(STDOUT_FILENO, "ids: %s", Ids().c_str());
      _exit(0);
    });
    SecPolicy::LoadPolicy(PolicyDir());
  });
  EXPECT_EQ(outcome.out, "ids: 1 2 0");
}

TEST_F(WellKnownDomainsTest, DomainOfAnEarlierLoadIsFoundWithoutItsFile) {
  Load();
  Remove("domains/globalVMDom");
  const Outcome outcome = Load();
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(Installed(outcome), AllBut({}));
}

// ---- Refusals ----------------------------------------------------------------------------------

struct Refusal {
  Operation operation;
  std::uint64_t call;
  const char* error;
  std::vector<std::string> installed;
  const char* ids;
};

const Refusal kRefusals[] = {
    {Operation::kFindDomain, 4, "find-domain, call 4", {kObjectsSet, kDomainsSet}, "0 0 0"},
    {Operation::kSetGlobalVMDomain,
     1,
     "set-global-vm-domain, call 1",
     {kObjectsSet, kDomainsSet},
     "2 0 0"},
    {Operation::kFindDomain,
     5,
     "find-domain, call 5",
     {kObjectsSet, kDomainsSet, kGlobalVMSet},
     "2 0 0"},
    {Operation::kSetIoFilterDomain,
     1,
     "set-io-filter-domain, call 1",
     {kObjectsSet, kDomainsSet, kGlobalVMSet},
     "2 3 0"},
    {Operation::kFindDomain,
     6,
     "find-domain, call 6",
     {kObjectsSet, kDomainsSet, kGlobalVMSet, kIoFilterSet},
     "2 3 0"},
};

TEST_F(WellKnownDomainsTest, RefusedLookUpLeavesAtOnceUnlogged) {
  for (const Refusal& row : kRefusals) {
    SCOPED_TRACE(row.error);
    FailNothing();
    Fail(row.operation, row.call);
    const Outcome outcome = Load();
    EXPECT_EQ(outcome.error, std::string("refused on request: ") + row.error);
    EXPECT_THAT(outcome.Errors(), IsEmpty());
    EXPECT_EQ(Installed(outcome), row.installed);
    ExpectClosedInterface(outcome);
  }
}

TEST_F(WellKnownDomainsTest, IdIsKeptBeforeTheKernelIsToldOfItsRole) {
  for (const Refusal& row : kRefusals) {
    SCOPED_TRACE(row.error);
    FailNothing();
    Fail(row.operation, row.call);
    EXPECT_EQ(IdsAfterLoad().value, std::string("failed: ") + row.ids);
  }
}

// ---- Getters -----------------------------------------------------------------------------------

TEST_F(WellKnownDomainsTest, IdsAreZeroBeforeALoad) { EXPECT_EQ(Ids(), "0 0 0"); }

TEST_F(WellKnownDomainsTest, IdsAreThoseOfTheKernelAfterALoad) {
  Policy("domains/aDom", "");  // so that the ids are not those of the smallest policy
  EXPECT_EQ(IdsAfterLoad().value, "3 4 2");
}

TEST_F(WellKnownDomainsTest, IdsAreKnownAfterALoadThatFailedInTheObjectsOnly) {
  Policy("objects/bad", "one two\n");
  EXPECT_EQ(IdsAfterLoad().value, "failed: 2 3 1");
}

TEST_F(WellKnownDomainsTest, IdsAreKnownAfterALoadThatFailedBehindThem) {
  Remove("fileLabels");
  EXPECT_EQ(IdsAfterLoad().value, "failed: 2 3 1");
}

TEST_F(WellKnownDomainsTest, DisplayDoesNotLookThemUp) {
  Load();
  const Outcome outcome = Run([] {
    SecPolicy::DisplayPolicy("");
    return Ids();
  });
  EXPECT_EQ(outcome.value, "0 0 0");
}

TEST_F(WellKnownDomainsTest, LoadThatEndsBeforeTheLookUpsLeavesTheIdsOfTheLastOne) {
  Fail(Fault{.operation = Operation::kWords, .call = 2, .kind = Fault::Kind::kOutOfMemory});
  const Outcome outcome = Run([&] {
    SecPolicy::LoadPolicy(PolicyDir());
    try {
      SecPolicy::LoadPolicy(PolicyDir());
    } catch (const std::bad_alloc&) {
      return "failed: " + Ids();
    }
    return Ids();
  });
  EXPECT_EQ(outcome.value, "failed: 2 3 1");
}

// A load looks up each of its three domains, then the three well-known ones, then a tardisk's.
TEST_F(WellKnownDomainsTest, RefusedLookUpLeavesTheIdsOfTheLastLoad) {
  for (const std::uint64_t call : {11U, 12U, 13U}) {
    SCOPED_TRACE(call);
    FailNothing();
    Fail(Operation::kFindDomain, call);
    const Outcome outcome = Run([&] {
      SecPolicy::LoadPolicy(PolicyDir());
      const std::string first = Ids();
      try {
        SecPolicy::LoadPolicy(PolicyDir());
      } catch (const std::exception& failure) {
        return first + " then " + Ids() + ", " + failure.what();
      }
      return std::string("not refused");
    });
    EXPECT_EQ(outcome.value,
              "2 3 1 then 2 3 1, refused on request: find-domain, call " + std::to_string(call));
  }
}

TEST_P(MissingDomainTest, LeavesTheIdsOfTheLastLoad) {
  WellKnownDomains();
  for (const MissingDomain& domain : kMissingDomains) {
    if (domain.name != std::string(GetParam().name)) {
      Policy(std::string("other/domains/") + domain.name, "");
    }
  }
  const Outcome outcome = Run([&] {
    SecPolicy::LoadPolicy(PolicyDir());
    const std::string first = Ids();
    SecPolicy::ZekAccessInterfaceImpl iface;
    unsigned int id = 0;
    iface.FindDomain(GetParam().name, &id);
    SecPolicy::DestroyDomain(id);
    try {
      throw std::runtime_error("the caller's own");
    } catch (const std::exception&) {
      try {
        SecPolicy::LoadPolicy(PolicyPath("other"));
      } catch (const std::exception&) {
        return first + " then " + Ids();
      }
    }
    return std::string("not ended");
  });
  EXPECT_EQ(outcome.value, "2 3 1 then 2 3 1");
}

TEST_F(WellKnownDomainsTest, LaterLoadReplacesTheIds) {
  const Outcome outcome = Run([&] {
    SecPolicy::LoadPolicy(PolicyDir());
    SecPolicy::DestroyDomain(SecPolicy::GetGlobalVMDomain());
    SecPolicy::CreateDomain("guestDom");  // takes the id that became free
    SecPolicy::LoadPolicy(PolicyDir());
    return Ids();
  });
  EXPECT_EQ(outcome.error, "");
  EXPECT_EQ(outcome.value, "4 3 1");
}

}  // namespace
}  // namespace SecPolicyTest
