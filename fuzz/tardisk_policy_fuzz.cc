// Tardisk policy files: refused as a second reading says; the rule before the first bad line is
// kept, and installing it concerns the tardisk that carries the file.

#include "fuzz/support/input.h"
#include "fuzz/support/plain_policy.h"
#include "fuzz/support/refused_look_ups.h"
#include "fuzz/support/require.h"
#include "fuzz/support/scratch_directory.h"
#include "fuzz/support/small_world.h"
#include "tardisk/tardisk_policy.h"
#include "tests/support/refusal.h"

namespace {

// What installing is refused with when labels cannot be looked up.
std::string ExpectedRefusal(const std::string& file, const std::vector<Fuzz::PlainRule>& rules) {
  if (rules.empty()) return "";
  return file + ":" + std::to_string(rules[0].line) +
         " : Tardisk: /tardisks/base.tar : asked for object " + rules[0].words[1];
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const Fuzz::ScratchDirectory root;
  static const std::string file = root.Path() + "/policy";
  const std::string bytes = Fuzz::BytesOf(data, size);
  Fuzz::WriteFile(file, bytes);
  SecPolicyTest::MemoryHost host(Fuzz::SmallDescription(),
                                 StandIn::ImageIndex{{{"base.tar", {"/policy"}}}}, root.Path());
  Fuzz::Populate(host.Module());
  Fuzz::RefusedLookUps lookUps;
  host.Add(lookUps);

  SecPolicy::ZekAccessInterfaceImpl iface;
  SecPolicy::TardiskPolicy policy(file);
  const std::string refusal = SecPolicyTest::RefusalOf([&] { policy.ParsePolicy(iface); });
  const Fuzz::PlainOutcome expected = Fuzz::ReadTardiskPlainly(file, Fuzz::PlainLinesOf(bytes));
  Fuzz::RequireError(refusal, expected);
  Fuzz::RequireEqual(SecPolicyTest::RefusalOf([&] { policy.SetPolicy(iface); }),
                     ExpectedRefusal(file, expected.rules), "the rule that was kept is installed");
  return 0;
}
