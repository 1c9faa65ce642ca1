// Verbs that stand below another, as "domain list" does.
#pragma once

#include <string>
#include <utility>

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {

class GroupTest : public CommandTest {
 protected:
  explicit GroupTest(std::string group) : group_(std::move(group)) {}

  // The use of a verb, the first of `arguments`, on the host.
  [[nodiscard]] Result Use(Arguments arguments) const {
    arguments.insert(arguments.begin(), group_);
    arguments.insert(arguments.begin() + 2, {"--host", Host()});
    return Command(arguments);
  }

  // What a use prints that has to succeed.
  std::string Out(const Arguments& arguments) const {
    const Result result = Use(arguments);
    EXPECT_EQ(result.status, 0) << result.err;
    return result.out;
  }

  void ExpectRefusal(const Arguments& arguments, const std::string& error) const {
    const Result result = Use(arguments);
    EXPECT_EQ(result.status, 1) << arguments[0];
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.err, "Error: " + error + "\n");
  }

 private:
  std::string group_;
};

}  // namespace SecPolicyTool
