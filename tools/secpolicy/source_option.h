// The policy that a verb works on.
#pragma once

#include <CLI/CLI.hpp>
#include <string>

#include "tools/policy/policy_source.h"

namespace SecPolicyTool {

// Adds the positional argument SOURCE, with `name` if the verb has several.
void AddSourceOption(CLI::App& verb, std::string& source, const std::string& name = "SOURCE");

// Adds "--policy SOURCE", for verbs that ask a policy: what the host's kernel holds without it.
void AddPolicyOption(CLI::App& verb, std::string& source);

// What is done with a directory of which a load reports errors.
enum class OnErrors {
  kWarn,    // a warning on standard error; the policy is what such a load installs
  kRefuse,  // its errors are reported and "DIR cannot be loaded without errors" is thrown
};

// The policy of `source` on the host `host` (see OpenHost). Throws as ReadSource does.
Policy ReadPolicy(const std::string& host, const std::string& source, OnErrors onErrors);

}  // namespace SecPolicyTool
