// What the handles of the C interface hold.
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "secpolicy/secpolicy_c.h"
#include "tools/policy/policy.h"

struct secpolicy_text {
  explicit secpolicy_text(std::string lines) : value(std::move(lines)) {}

  std::string value;
};

struct secpolicy_host {
  std::string path;  // absolute
};

struct secpolicy_policy {
  std::string host;    // the path of its host
  std::string source;  // as given; empty for the host's own directory
  SecPolicyTool::Policy content;
  std::vector<std::string> errors;
};
