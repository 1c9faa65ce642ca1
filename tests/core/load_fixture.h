// Loads of a policy that has something for every stage.
#pragma once

#include <algorithm>
#include <filesystem>
#include <string>
#include <vector>

#include "tests/core/descriptors.h"
#include "tests/support/host_test.h"

namespace SecPolicyTest {

// What a stage leaves in the trace of a load of LoadTest's policy.
inline constexpr char kObjectsSet[] = "add-labels object apps";
inline constexpr char kDomainsSet[] = "set-rule appDom -s read grant # line 1";
inline constexpr char kGlobalVMSet[] = "set-global-vm-domain globalVMDom";
inline constexpr char kIoFilterSet[] = "set-io-filter-domain ioFilterDom";
inline constexpr char kTardisksSet[] = "set-rule rootDom -d tardisk appDom exec grant # into 1";
inline constexpr char kFileLabelsSet[] = "set-file-label /bin/tool apps";

class LoadTest : public HostTest {
 protected:
  LoadTest() {
    WellKnownDomains();
    Tardisk("base.tgz").File("bin/tool", "x");
    Policy("objects/main", "apps\n");
    Policy("domains/appDom", "-s read grant\n");
    Policy("fileLabels/main", "/bin/tool apps\n");
  }

  void Remove(const std::string& file) { std::filesystem::remove_all(PolicyPath(file)); }

  // What was installed, in the order in which it was: refused operations are left out, and so are
  // those that install nothing.
  static std::vector<std::string> Installed(const Outcome& outcome) {
    auto operations = outcome.Operations({"add-labels", "set-rule", "set-global-vm-domain",
                                          "set-io-filter-domain", "set-file-label"});
    std::erase_if(operations, [](const std::string& operation) {
      return operation == "add-labels object" || operation.find(" ! ") != std::string::npos;
    });
    return operations;
  }

  // All that a load installs, without what `missing` names.
  static std::vector<std::string> AllBut(const std::vector<std::string>& missing) {
    std::vector<std::string> all{kObjectsSet,  kDomainsSet,  kGlobalVMSet,
                                 kIoFilterSet, kTardisksSet, kFileLabelsSet};
    std::erase_if(all, [&](const std::string& operation) {
      return std::find(missing.begin(), missing.end(), operation) != missing.end();
    });
    return all;
  }

  // That the load opened one interface before all else and closed it after all else.
  static void ExpectClosedInterface(const Outcome& outcome) {
    ASSERT_FALSE(outcome.events.empty());
    EXPECT_EQ(outcome.events.front(), "kernel: open-interface");
    EXPECT_EQ(outcome.events.back(), "kernel: close-interface");
    EXPECT_EQ(outcome.Operations({"open-interface", "close-interface"}).size(), 2U);
  }

  // The errors as standard error shows them.
  static std::string AsLines(const std::vector<std::string>& errors) {
    std::string lines;
    for (const std::string& error : errors) lines += "Error: " + error + "\n";
    return lines;
  }
};

}  // namespace SecPolicyTest
