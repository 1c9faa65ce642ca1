// The policy that a verb works on.
#pragma once

#include <string>

#include "tools/command_line/command_line.h"
#include "tools/policy/policy_source.h"

namespace SecPolicyTool {

// The operand SOURCE, with another name if the verb has several.
CommandOption SourceOperand(std::string& source, const std::string& name = "SOURCE");

// The operand for a policy directory that need not be given: the host's own is meant then.
CommandOption OwnPolicyOperand(std::string& dir, const std::string& name);

// "--policy SOURCE", for verbs that ask a policy: what the host's kernel holds without it.
CommandOption PolicyOption(std::string& source);

// What is done with a directory of which a load reports errors.
enum class OnErrors {
  kWarn,    // a warning on standard error; the policy is what such a load installs
  kRefuse,  // its errors are reported and "DIR cannot be loaded without errors" is thrown
};

// The policy of `source` on the host `host` (see OpenHost). Throws as ReadSource does.
Policy ReadPolicy(const std::string& host, const std::string& source, OnErrors onErrors);

}  // namespace SecPolicyTool
