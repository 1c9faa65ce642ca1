// What a check finds in a policy.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "tools/policy/policy.h"

namespace SecPolicyTool {

enum class Severity : std::uint8_t {
  kError,    // a load reports it, or is terminated by it
  kWarning,  // a load says nothing, but what was meant is probably something else
};

struct Finding {
  std::string id;  // of the kind of finding, stable, for example "unknown-word"
  Severity severity = Severity::kError;
  Place place;              // without a line where it is a file, without a file where it is neither
  unsigned int length = 0;  // in bytes, of what is wrong; 0 for the whole line
  std::string message;      // what is wrong
  std::string loadMessage;  // the words in which a load reports it; empty for a warning
  std::string help;         // what would be right; empty when that is not known
  std::string source;       // the line; empty without a line
};

}  // namespace SecPolicyTool
