// Processes with a kernel of their own.
#include <unistd.h>

#include <array>

#include "tests/host/session/session_fixture.h"

namespace StandIn {
namespace {

using Kernel = SessionOptions::Kernel;

SessionOptions With(Kernel kernel) {
  SessionOptions options;
  options.kernel = kernel;
  return options;
}

class OwnKernelTest : public SessionTest {
 protected:
  // A host whose kernel has the domain netDom.
  OwnKernelTest() {
    Assembled();
    Create("netDom");
  }

  void Create(const std::string& domain) const {
    InHost([&](Session& session) { session.Module().CreateDomain(domain, DomainOrigin::kPolicy); });
  }

  static bool Has(Session& session, const std::string& domain) {
    return session.Module().FindDomain(domain).has_value();
  }
};

TEST_F(OwnKernelTest, SnapshotHoldsWhatTheHostsDidAtItsStart) {
  InHost(With(Kernel::kSnapshot), [&](Session& session) {
    EXPECT_TRUE(Has(session, "netDom"));
    EXPECT_EQ(session.Module().GetDomainInfo(1)->name, "netDom");
  });
}

TEST_F(OwnKernelTest, ScratchKernelHasJustBeenStarted) {
  InHost(With(Kernel::kScratch), [&](Session& session) {
    EXPECT_FALSE(Has(session, "netDom"));
    EXPECT_TRUE(Has(session, "rootDom"));
  });
}

TEST_F(OwnKernelTest, WhatIsDoneInItIsForgottenWithTheProcess) {
  const std::string before = ReadBytes(Path("kernel.json"));
  for (const Kernel kernel : {Kernel::kSnapshot, Kernel::kScratch}) {
    InHost(With(kernel), [&](Session& session) {
      session.Module().CreateDomain("appDom", DomainOrigin::kPolicy);
      EXPECT_TRUE(Has(session, "appDom"));
      session.BeginBatch();
      EXPECT_TRUE(Has(session, "appDom"));
      session.Commit();
    });
    EXPECT_EQ(ReadBytes(Path("kernel.json")), before);
  }
}

TEST_F(OwnKernelTest, SnapshotHoldsNoLockAndSeesNoLaterChange) {
  std::array<int, 2> entered{};
  std::array<int, 2> changed{};
  ASSERT_EQ(pipe(entered.data()) | pipe(changed.data()), 0);
  const pid_t child = StartChild([&] {
    Enter(With(Kernel::kSnapshot), [&](Session& session) {
      char word = 0;
      EXPECT_EQ(write(entered[1], &word, 1), 1);
      EXPECT_EQ(read(changed[0], &word, 1), 1);
      EXPECT_FALSE(Has(session, "lateDom"));
    });
  });
  char word = 0;
  EXPECT_EQ(read(entered[0], &word, 1), 1);
  Create("lateDom");
  EXPECT_EQ(write(changed[1], &word, 1), 1);
  EXPECT_TRUE(ChildPassed(child));
  for (const int end : {entered[0], entered[1], changed[0], changed[1]}) close(end);
  InHost([&](Session& session) { EXPECT_TRUE(Has(session, "lateDom")); });
}

}  // namespace
}  // namespace StandIn
