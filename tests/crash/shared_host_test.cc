// Twenty processes at the same time on one host.
#include <gmock/gmock.h>

#include <chrono>
#include <iostream>

#include "tests/crash/amount.h"
#include "tests/crash/host_user.h"
#include "tests/crash/shared_memory.h"
#include "tests/host/session/session_fixture.h"
#include "tests/host/state/kept_module.h"

namespace CrashTest {
namespace {

using StandIn::DomainId;
using StandIn::KeptModule;

class SharedHostTest : public StandIn::SessionTest {
 protected:
  [[nodiscard]] std::string LogOf(std::size_t user) const {
    return Visible() + "/" + std::to_string(user);
  }

  // Runs a user of the host, in this process.
  void Use(std::size_t user, DomainId common, std::size_t operations) const {
    OperationLog log(LogOf(user));
    Enter({}, [&](StandIn::Session&) {
      HostUser self(user, common, *board_, log);
      for (std::size_t i = 0; i < operations; ++i) self.DoSomething();
      self.GiveBackContestedNames();
    });
  }

  // What the kernel holds apart from `common` and the predefined domain.
  [[nodiscard]] Account Held(DomainId common) const {
    Account held;
    KeptModule kernel(Host());
    for (DomainId id = 1; id < kSlots; ++id) {
      const auto info = kernel.Module().GetDomainInfo(id);
      if (info && id != common) held.domains[info->name] = id;
    }
    for (const StandIn::FileRule& rule : kernel.Module().FileRules(common)) {
      EXPECT_TRUE(held.rules.emplace(rule.path, rule.permission).second) << rule.path;
    }
    return held;
  }

  [[nodiscard]] Account Logged() const {
    Account logged;
    for (std::size_t user = 0; user < kUsers; ++user) logged.Add(LogOf(user));
    return logged;
  }

  Shared<Board> board_;
};

TEST_F(SharedHostTest, OfTwentyProcessesNoOperationIsLostOrDoubled) {
  Assembled();
  KeptModule(Host()).Create("commonDom");
  const DomainId common = 1;
  const auto operations = static_cast<std::size_t>(Either(60, 600));
  const auto start = std::chrono::steady_clock::now();
  std::vector<pid_t> users;
  for (std::size_t user = 0; user < kUsers; ++user) {
    users.push_back(StandIn::StartChild([&] { Use(user, common, operations); }));
  }
  for (const pid_t user : users) EXPECT_TRUE(StandIn::ChildPassed(user));

  const Account logged = Logged();
  const Account held = Held(common);
  EXPECT_EQ(logged.contradiction, "");
  EXPECT_EQ(held.domains, logged.domains);
  EXPECT_EQ(held.rules, logged.rules);
  EXPECT_GT(logged.operations, kUsers * operations / 4);
  const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - start;
  std::cout << kUsers * operations << " operations of " << kUsers << " processes, "
            << logged.operations << " of them changes, in " << taken.count()
            << " s; the longest took " << board_->longestMicroseconds / 1000 << " ms\n";
}

}  // namespace
}  // namespace CrashTest
