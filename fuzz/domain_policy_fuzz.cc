// Domain files: the first bad line is refused as a second reading says, the rules of the lines
// before it are kept as they stand, and the constraint check finds the first contradiction.
#include <iostream>

#include "domain/domain_policy.h"
#include "fuzz/support/input.h"
#include "fuzz/support/plain_policy.h"
#include "fuzz/support/require.h"
#include "fuzz/support/small_world.h"
#include "tests/support/captured.h"
#include "tests/support/memory_file.h"
#include "tests/support/refusal.h"

namespace {

std::string PrintedBy(SecPolicy::DomainPolicy& policy) {
  const SecPolicyTest::Captured out(std::cout);
  policy.PrintPolicy();
  return out.Text();
}

void RequireConstraintError(const std::string& found, const std::vector<Fuzz::PlainRule>& rules) {
  const auto [first, second] = Fuzz::FirstContradiction(rules);
  Fuzz::Require(found.empty() == (first == 0), "a contradiction is found where there is one");
  if (found.empty()) return;
  Fuzz::Require(found.starts_with("Policy constraint error for domain: appDom : the capability "),
                "a contradiction is named");
  Fuzz::Require(found.find(" on line " + std::to_string(first) + " and ") != std::string::npos &&
                    found.ends_with(" on line " + std::to_string(second)),
                "both lines of a contradiction are named");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static SecPolicyTest::MemoryFile file;
  const std::string bytes = Fuzz::BytesOf(data, size);
  file.Write(bytes);
  SecPolicyTest::MemoryHost host(Fuzz::SmallDescription());
  Fuzz::Populate(host.Module());
  const std::string before = host.Module().Save();

  SecPolicy::ZekAccessInterfaceImpl iface;
  SecPolicy::DomainPolicy policy("appDom", Fuzz::kAppDomain);
  policy.SetPolicyFile(file.Path());
  const std::string refusal = SecPolicyTest::RefusalOf([&] { policy.ParsePolicy(iface); });
  const Fuzz::PlainOutcome expected = Fuzz::ReadDomainPlainly("appDom", Fuzz::PlainLinesOf(bytes));
  Fuzz::RequireError(refusal, expected);
  Fuzz::RequireEqual(PrintedBy(policy), Fuzz::PrintedPlainly(expected.rules),
                     "the lines before the first bad one are kept");
  RequireConstraintError(SecPolicyTest::RefusalOf([&] { policy.CheckPolicyConstraints(iface); }),
                         expected.rules);
  Fuzz::Require(host.Module().Save() == before, "parsing and checking change nothing");
  return 0;
}
