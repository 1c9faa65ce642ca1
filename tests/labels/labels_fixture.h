// Labels of a host of the test's own.
#pragma once

#include <string>
#include <vector>

#include "tests/support/host_test.h"

namespace SecPolicyTest {

using ZekCtl::Security::kDomainLabel;
using ZekCtl::Security::kObjectLabel;
using ZekCtl::Security::ZekAccessLabelType;

class LabelsTest : public HostTest {
 protected:
  // Defines labels as an earlier load would have. On a fresh host the ids go on from those of the
  // predefined ones: 3 for the first object.
  void Define(const std::vector<std::string>& labels, ZekAccessLabelType type = kObjectLabel) {
    RunWithInterface([&](auto& iface) { iface.AddLabels(labels, type); });
  }

  // Every object and its id, in the order of their names.
  std::vector<std::pair<std::string, long>> Objects() {
    std::vector<std::pair<std::string, long>> objects;
    const Outcome outcome = RunWithInterface([](auto& iface) {
      std::string text;
      for (const auto& [name, id] : iface.GetKeywordsMap(ZekCtl::Security::kObjectKeyword)) {
        text += name + " " + std::to_string(id) + "\n";
      }
      return text;
    });
    std::istringstream stream(outcome.value);
    for (std::pair<std::string, long> object; stream >> object.first >> object.second;) {
      objects.push_back(object);
    }
    return objects;
  }

  // The label that the file carries, or why it cannot be read.
  std::string LabelOf(const std::string& path) {
    const Outcome outcome =
        RunWithInterface([&](auto& iface) { return SecPolicy::GetFileLabel(path, iface); });
    return outcome.error.empty() ? outcome.value : outcome.error;
  }
};

// The last list of labels that the kernel was given to add.
inline std::string LastAdded(const Outcome& outcome) {
  const std::vector<std::string> lists = outcome.Operations({"add-labels"});
  return lists.empty() ? "(none)" : lists.back();
}

// The operations "lookup-label" and "set-file-label" of labelling these paths, in order.
inline std::vector<std::string> Labelling(const std::vector<std::string>& paths,
                                          const std::string& label) {
  std::vector<std::string> operations;
  for (const std::string& path : paths) {
    operations.push_back("lookup-label object " + label);
    operations.push_back("set-file-label " + path + " " + label);
  }
  return operations;
}

}  // namespace SecPolicyTest
