// A host whose kernel holds one policy, and another policy that is being loaded into it.
#pragma once

#include <gtest/gtest.h>

#include <set>
#include <string>

#include "tests/tools/command_fixture.h"

namespace CrashTest {

class LoadingHost : public SecPolicyTool::CommandTest {
 protected:
  // The policy directory holds `domains` domains with `rules` rules each.
  LoadingHost(int domains, int rules);

  // What the kernel held before the load, and what it holds after an undisturbed one.
  [[nodiscard]] const std::string& OldState() const { return oldState_; }
  [[nodiscard]] const std::string& NewState() const { return newState_; }

  [[nodiscard]] std::string State() const;
  // Puts the host back to a state.
  void SetState(const std::string& state) const;

  // Becomes `secpolicy load`, whose messages go to the file LoadErrors reads.
  [[noreturn]] void BecomeLoad() const;
  [[nodiscard]] std::string LoadErrors() const { return StandIn::ReadBytes(Path("errors")); }

  // Expects a host on which nothing stands in the way of the next one: the state is read without a
  // complaint, nobody holds the lock, and the next load ends as if nothing had happened, with
  // nothing left over.
  void ExpectUsable() const;

  // The files that a save left besides the state.
  [[nodiscard]] std::set<std::string> LeftOver() const;

 private:
  [[nodiscard]] bool IsLocked() const;
  [[nodiscard]] std::set<std::string> Names() const;

  std::string oldState_;
  std::string newState_;
  std::set<std::string> names_;
};

}  // namespace CrashTest
