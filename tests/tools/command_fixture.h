// The command as a process.
#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "tests/support/archives.h"
#include "tests/support/temporary_directory.h"

namespace SecPolicyTool {

using Arguments = std::vector<std::string>;

// How a process ended and what it wrote.
struct Result {
  int status = -1;  // of its exit; -1 when a signal ended it
  std::string out;
  std::string err;

  // The lines of `err`.
  [[nodiscard]] std::vector<std::string> Errors() const;
};

// Runs a program, which `prepare` readies in its process, to its end.
Result RunProgram(const std::string& program, const Arguments& arguments,
                  const std::function<void()>& prepare);

// A directory with a host and a policy, for one test.
class CommandTest : public testing::Test {
 protected:
  CommandTest();

  // Runs the command. XDG_STATE_HOME is the directory "state" of the test's, and there is no HOME,
  // unless `prepare` changes that.
  Result Command(
      const Arguments& arguments, const std::function<void()>& prepare = [] {}) const;

  // The command's result for a use that has to succeed.
  Result Done(const Arguments& arguments) const;

  [[nodiscard]] std::string Path(const std::string& name) const { return base_ + "/" + name; }
  [[nodiscard]] std::string Host() const { return Path("host"); }
  [[nodiscard]] std::string PolicyDir() const { return Path("policy"); }

  // Makes the host, with these archives, and assembles it.
  void MakeHost(const std::vector<std::pair<std::string, StandIn::Archive>>& tardisks = {}) const;

  // A file of the policy directory, for example "domains/appDom".
  void Policy(const std::string& file, const std::string& text) const;

  Result Load(const Arguments& more = {}) const;
  [[nodiscard]] std::string Shown() const { return Done({"show", "--host", Host()}).out; }

 private:
  StandIn::TemporaryDirectory directory_;
  std::string base_;  // without the double slash that the environment may bring
};

}  // namespace SecPolicyTool
