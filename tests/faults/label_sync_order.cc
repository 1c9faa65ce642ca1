#include "tests/faults/label_sync_order.h"

#include <array>
#include <string_view>

namespace SecPolicyFaults {

namespace {

constexpr std::array<std::string_view, 5> kCalls{"invalid-labels", "remove-labels", "add-labels",
                                                 "remove-labels", "add-labels"};

bool ChangesLabels(std::string_view operation) {
  return operation.starts_with("invalid-labels ") || operation.starts_with("remove-labels ") ||
         operation.starts_with("add-labels ");
}

}  // namespace

std::vector<std::string> WrongLabelCalls(const RunResult& undisturbed) {
  std::size_t next = 0;
  std::string type;
  for (const Event& event : undisturbed.events) {
    if (event.kind != EventKind::kOperation || !ChangesLabels(event.text)) continue;
    const std::string own = event.text.substr(event.text.find(' ') + 1);
    if (next == 0) type = own.substr(0, own.find(' '));
    const std::string due = std::string(kCalls[next]) + " " + type;
    if (event.text != due && !event.text.starts_with(due + " ")) {
      return {"labels are changed by: " + event.text + "\n      due: " + due};
    }
    next = (next + 1) % kCalls.size();
  }
  if (next == 0) return {};
  return {"labels are not changed by: " + std::string(kCalls[next]) + " " + type};
}

}  // namespace SecPolicyFaults
