// Object files: refused as a second reading says, and the kernel's objects become the names of the
// lines before the first bad one.
#include <algorithm>

#include "fuzz/support/input.h"
#include "fuzz/support/plain_policy.h"
#include "fuzz/support/require.h"
#include "fuzz/support/small_world.h"
#include "labels/object_policy.h"
#include "tests/support/memory_file.h"
#include "tests/support/system_log.h"

namespace {

using Tavon::Lib::TavonException;

constexpr std::size_t kLongestName = 127;
constexpr std::size_t kMostObjects = 12;  // as the small world says

// The objects that a module that had those of the small world has afterwards. Names are added one
// by one until one will not do or there is no room.
std::vector<std::string> ExpectedObjects(const std::vector<Fuzz::PlainRule>& rules) {
  std::vector<std::string> objects;
  const auto has = [&objects](const std::string& name) {
    return std::find(objects.begin(), objects.end(), name) != objects.end();
  };
  for (const std::string& name : Fuzz::kSmallObjects) {
    const bool isNamed = std::any_of(rules.begin(), rules.end(),
                                     [&](const auto& rule) { return rule.words[0] == name; });
    if (isNamed || name == "default" || name == "tardisk") objects.push_back(name);
  }
  for (const Fuzz::PlainRule& rule : rules) {
    const std::string& name = rule.words[0];
    if (name.size() > kLongestName) break;
    if (has(name)) continue;
    if (objects.size() == kMostObjects) break;
    objects.push_back(name);
  }
  std::sort(objects.begin(), objects.end());
  return objects;
}

std::vector<std::string> ObjectsOf(StandIn::SecurityModule& module) {
  std::vector<std::string> objects;
  for (const auto& [name, id] : module.Words(StandIn::WordList::kObjects)) objects.push_back(name);
  return objects;
}

void SetObjects(SecPolicy::ObjectPolicy& policy, SecPolicy::ZekAccessInterfaceImpl& iface) try {
  policy.SetObjects(iface);
} catch (const TavonException&) {
  // A name that will not do; what was done until then is compared.
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

  SecPolicy::ZekAccessInterfaceImpl iface;
  SecPolicy::ObjectPolicy policy;
  std::string refusal;
  try {
    policy.ParsePolicy(file.Path());
  } catch (const TavonException& failure) {
    refusal = failure.what();
  }
  const Fuzz::PlainOutcome expected =
      Fuzz::ReadObjectsPlainly(file.Path(), Fuzz::PlainLinesOf(bytes));
  Fuzz::RequireError(refusal, expected);
  SetObjects(policy, iface);
  Fuzz::RequireEqual(Fuzz::Joined(ObjectsOf(host.Module()), "\n"),
                     Fuzz::Joined(ExpectedObjects(expected.rules), "\n"),
                     "the objects are those of the file");
  return 0;
}
