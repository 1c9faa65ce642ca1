// Checks of policies, in a host of one's own.
#pragma once

#include <string>
#include <vector>

#include "tests/tools/command_fixture.h"
#include "tools/check/check.h"

namespace SecPolicyTool {

// A policy without findings, and a host with two tardisks.
class CheckTest : public CommandTest {
 protected:
  CheckTest();
  void SetUp() override { MakeCheckHost(); }
  void MakeCheckHost() const;

  // The command with these arguments on the test's host and policy.
  Result Check(const Arguments& more = {}) const;

  // The findings of `CheckPolicy`: "FILE:LINE:COLUMN: error: MESSAGE [id]", the policy directory
  // left out.
  [[nodiscard]] std::vector<std::string> Found() const;
  [[nodiscard]] std::vector<Finding> Findings() const;
  [[nodiscard]] std::string WithoutDir(std::string text) const;

  // What a load of the policy reports.
  [[nodiscard]] std::vector<std::string> LoadErrorsOf() const;

  // A file in the root of the host's first or second tardisk; before SetUp.
  StandIn::Archive base_;
  StandIn::Archive vendor_;
};

}  // namespace SecPolicyTool
