// Object files: refused as a second reading says, and the kernel's objects become the names of the
// lines before the first bad one.
#include <algorithm>

#include "fuzz/support/input.h"
#include "fuzz/support/plain_policy.h"
#include "fuzz/support/require.h"
#include "fuzz/support/small_world.h"
#include "labels/object_policy.h"
#include "tests/support/memory_file.h"
#include "tests/support/refusal.h"
#include "tests/support/system_log.h"

namespace {

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
  const std::string refusal = SecPolicyTest::RefusalOf([&] { policy.ParsePolicy(file.Path()); });
  const Fuzz::PlainOutcome expected =
      Fuzz::ReadObjectsPlainly(file.Path(), Fuzz::PlainLinesOf(bytes));
  Fuzz::RequireError(refusal, expected);
  // A name that will not do is refused; what was done until then is compared.
  static_cast<void>(SecPolicyTest::RefusalOf([&] { policy.SetObjects(iface); }));
  Fuzz::RequireEqual(Fuzz::Joined(ObjectsOf(host.Module()), "\n"),
                     Fuzz::Joined(ExpectedObjects(expected.rules), "\n"),
                     "the objects are those of the file");
  return 0;
}
