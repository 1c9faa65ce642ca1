// A request that the host or the policy at hand does not allow for.
#pragma once

#include <stdexcept>

namespace SecPolicyTool {

// What is wrong with a request in itself: a word that is none, a pattern that cannot be read.
class BadRequest : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

}  // namespace SecPolicyTool
