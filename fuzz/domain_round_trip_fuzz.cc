// A domain's rules from their file into the kernel, read back, printed, and from that print into
// another kernel: both kernels hold the same, and print the same.
#include <iostream>

#include "domain/domain_policy.h"
#include "fuzz/support/input.h"
#include "fuzz/support/plain_reader.h"
#include "fuzz/support/require.h"
#include "fuzz/support/small_world.h"
#include "host/gate/gate.h"
#include "tests/support/captured.h"
#include "tests/support/memory_file.h"
#include "tests/support/refusal.h"
#include "tests/support/system_log.h"
#include "tests/support/unresolved_paths.h"

namespace {

// A kernel of the small world, to which a domain's file is handed.
class Kernel {
 public:
  Kernel() : host_(Fuzz::SmallDescription()) {
    Fuzz::Populate(host_.Module());
    host_.Add(paths_);
  }

  // What parsing, checking and setting are refused with, and not gone on with; nothing for none.
  std::string Load(const std::string& text) {
    static SecPolicyTest::MemoryFile file;
    file.Write(text);
    SecPolicy::ZekAccessInterfaceImpl iface;
    SecPolicy::DomainPolicy policy("appDom", Fuzz::kAppDomain);
    policy.SetPolicyFile(file.Path());
    // The rules before a bad line are set all the same.
    const std::string badLine = SecPolicyTest::RefusalOf([&] { policy.ParsePolicy(iface); });
    const std::string refusal = SecPolicyTest::RefusalOf([&] {
      policy.CheckPolicyConstraints(iface);
      policy.SetPolicy(iface);
    });
    return refusal.empty() ? badLine : refusal;
  }

  std::string Printed() {
    SecPolicy::ZekAccessInterfaceImpl iface;
    SecPolicy::DomainPolicy policy("appDom", Fuzz::kAppDomain);
    const SecPolicyTest::Captured errors(std::cerr);
    policy.ReadSystemPolicy(iface);
    Fuzz::RequireEqual(errors.Text(), "", "every rule type can be read");
    const SecPolicyTest::Captured out(std::cout);
    policy.PrintPolicy();
    return out.Text();
  }

  // Everything but the lines of the rules.
  std::string Held() {
    std::string text;
    for (const auto& info : ZekCtl::Security::kRuleTypes) {
      if (!info.HasDecision()) continue;
      for (const StandIn::Rule& rule : host_.Module().Rules(info.type, Fuzz::kAppDomain)) {
        text += info.keyword + Fuzz::Joined({rule.words.begin(), rule.words.end()}, "|") + ">" +
                std::to_string(rule.targetDomain) +
                (rule.decision == StandIn::Decision::kGrant ? "+\n" : "-\n");
      }
    }
    for (const StandIn::FileRule& rule : host_.Module().FileRules(Fuzz::kAppDomain)) {
      text += std::to_string(rule.world) + rule.path + "=" + std::to_string(rule.permission) + "\n";
    }
    return text;
  }

  std::string Save() { return host_.Module().Save(); }

 private:
  SecPolicyTest::UnresolvedPaths paths_;
  SecPolicyTest::MemoryHost host_;
};

bool HasLongLine(const std::string& text) {
  std::size_t length = 0;
  for (const char c : text) {
    length = c == '\n' ? 0 : length + 1;
    if (length > 1023) return true;
  }
  return false;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  static SecPolicyTest::MemoryFile log;
  SecPolicyTest::CaptureSystemLog(log.Descriptor());
  StandIn::EnterGate();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  std::string printed;
  std::string held;
  {
    Kernel kernel;
    kernel.Load(Fuzz::BytesOf(data, size));
    printed = kernel.Printed();
    held = kernel.Held();
  }
  // A path rule without letters is printed with a space more than it may have been written with.
  if (HasLongLine(printed)) return 0;

  std::string saved;
  {
    Kernel kernel;
    Fuzz::RequireEqual(kernel.Load(printed), "", "what is printed can be loaded");
    Fuzz::RequireEqual(kernel.Printed(), printed, "what was loaded is printed the same");
    Fuzz::RequireEqual(kernel.Held(), held, "both kernels hold the same");
    saved = kernel.Save();
  }
  Kernel kernel;
  kernel.Load(printed);
  Fuzz::RequireEqual(kernel.Save(), saved, "the same text makes the same state");
  return 0;
}
