// Domains of a host: their policy files, the domain stage, and what the kernel holds afterwards.
#pragma once

#include <queue>
#include <string>
#include <vector>

#include "tests/support/host_test.h"

namespace SecPolicyTest {

// The words of a policy line.
std::queue<std::string> WordsOf(const std::string& line);

// The domain's id; the domain is made where it is missing. Leaves nothing in the trace.
unsigned int DomainCalled(const std::string& name);

// The number that the next file to be opened would get: the same before and after something that
// leaves nothing open.
int LowestFreeDescriptor();

class DomainTest : public HostTest {
 protected:
  void Domain(const std::string& name, const std::string& text) { Policy("domains/" + name, text); }

  // The domain stage alone.
  Outcome LoadDomains();

  // The rules that the kernel holds for the domain, as the display prints them. No fault is in
  // force any more once this was asked.
  std::vector<std::string> RulesOf(const std::string& domain);
};

}  // namespace SecPolicyTest
