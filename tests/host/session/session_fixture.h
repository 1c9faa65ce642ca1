// Processes that enter a host.
#pragma once

#include <gmock/gmock.h>
#include <sys/prctl.h>

#include <functional>
#include <string>

#include "host/module/description_json.h"
#include "host/session/session.h"
#include "tests/host/root/host_fixture.h"
#include "tests/support/child_process.h"

namespace StandIn {

class SessionTest : public HostFixture {
 protected:
  // A host with everything as it is by default; it has to be assembled.
  SessionTest() {
    WriteBytes(Path("host.json"), DefaultDescriptionText());
    std::filesystem::create_directory(Visible());
  }

  // A directory outside the host.
  [[nodiscard]] std::string Visible() const {
    return std::filesystem::path(Path()).parent_path().string() + "/policy";
  }

  // Runs `body` in a process of its own; expectations in it count.
  static void InChild(const std::function<void()>& body) {
    const pid_t child = StartChild(body);
    EXPECT_TRUE(ChildPassed(child));
  }

  // The same as an ordinary user, to whom the host is given.
  void AsOrdinaryUser(const std::function<void()>& body) const {
    for (const char* name : {"/..", "", "/tardisks"}) GiveToOrdinaryUser(Path() + name);
    const bool passed = PassesAsOrdinaryUser([&] {
      prctl(PR_SET_DUMPABLE, 1);  // as a program has it that this user started
      body();
    });
    EXPECT_TRUE(passed);
  }

  // In a process of its own that has entered the host.
  void InHost(const SessionOptions& options, const std::function<void(Session&)>& body) const {
    InChild([&] { Enter(options, body); });
  }
  void InHost(const std::function<void(Session&)>& body) const { InHost({}, body); }

  // Enters with this process, for good.
  void Enter(const SessionOptions& options, const std::function<void(Session&)>& body) const {
    Session session(HostDirectory(Path()), options);
    body(session);
  }

  // Expects that this process cannot enter the host, and keeps the root directory that it has.
  void ExpectRefusal(const testing::Matcher<std::string>& error,
                     const SessionOptions& options = {}) const {
    EXPECT_THAT(MessageOf<HostError>([&] { Enter(options, [](Session&) {}); }), error);
    EXPECT_TRUE(Exists("host.json"));
  }
};

}  // namespace StandIn
