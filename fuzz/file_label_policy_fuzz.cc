// File label files: refused as a second reading says; the mappings of the lines before the first
// bad one are applied in their order, each named by its line when it fails.
#include <iostream>

#include "fuzz/support/input.h"
#include "fuzz/support/plain_policy.h"
#include "fuzz/support/refused_look_ups.h"
#include "fuzz/support/require.h"
#include "fuzz/support/small_world.h"
#include "labels/file_label_policy.h"
#include "tests/support/captured.h"
#include "tests/support/memory_file.h"
#include "tests/support/refusal.h"
#include "tests/support/system_log.h"

namespace {

// What is logged when no mapping can be applied.
std::string ExpectedErrors(const std::string& file, const std::vector<Fuzz::PlainRule>& rules) {
  std::string errors;
  for (const Fuzz::PlainRule& rule : rules) {
    errors += "Error: " + file + ":" + std::to_string(rule.line) + " : asked for object " +
              rule.words[1] + "\n";
  }
  return errors;
}

// What setting the labels logs; it is to fail when there is a mapping.
std::string ErrorsOf(SecPolicy::FileLabelPolicy& policy, SecPolicy::ZekAccessInterfaceImpl& iface,
                     bool isToFail) {
  const SecPolicyTest::Captured errors(std::cerr);
  const std::string refusal = SecPolicyTest::RefusalOf([&] { policy.SetFileLabels(iface); });
  Fuzz::RequireEqual(refusal, isToFail ? "There was a failure in setting file labels" : "",
                     "a failed mapping fails the whole");
  return errors.Text();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static SecPolicyTest::MemoryFile file;
  static SecPolicyTest::MemoryFile log;
  log.Write("");
  SecPolicyTest::CaptureSystemLog(log.Descriptor());
  const std::string bytes = Fuzz::BytesOf(data, size);
  file.Write(bytes);
  SecPolicyTest::MemoryHost host(Fuzz::SmallDescription());
  Fuzz::Populate(host.Module());
  Fuzz::RefusedLookUps lookUps;
  host.Add(lookUps);

  SecPolicy::ZekAccessInterfaceImpl iface;
  SecPolicy::FileLabelPolicy policy;
  const std::string refusal =
      SecPolicyTest::RefusalOf([&] { policy.ParsePolicy(file.Path(), iface); });
  const Fuzz::PlainOutcome expected =
      Fuzz::ReadFileLabelsPlainly(file.Path(), Fuzz::PlainLinesOf(bytes));
  Fuzz::RequireError(refusal, expected);
  Fuzz::RequireEqual(ErrorsOf(policy, iface, !expected.rules.empty()),
                     ExpectedErrors(file.Path(), expected.rules),
                     "the mappings before the first bad line are applied in order");
  Fuzz::RequireEqual(ErrorsOf(policy, iface, false), "", "every mapping is forgotten");
  return 0;
}
