// The operations of the simulated module on labels and on the labels of files.
#include <algorithm>
#include <cerrno>

#include "host/module/description_json.h"
#include "host/module/module_error.h"
#include "host/module/simulated_module.h"
#include "platform/tavon_strcat.h"

namespace StandIn {

using Tavon::Misc::StrCat;

LabelTable& SimulatedModule::Labels(LabelType type) const {
  const auto index = static_cast<std::size_t>(type);
  if (index >= state_->labels.size()) {
    throw ModuleError(EINVAL, StrCat("no label type has the number ", index));
  }
  return state_->labels[index];
}

std::vector<std::string> SimulatedModule::InvalidLabels(LabelType type) {
  return Labels(type).Invalid();
}

void SimulatedModule::AddLabels(const std::vector<std::string>& labels, LabelType type) {
  LabelTable& table = Labels(type);
  for (const std::string& label : labels) {
    table.Add(label);
  }
}

void SimulatedModule::RemoveLabels(const std::vector<std::string>& labels, LabelType type) {
  LabelTable& table = Labels(type);
  for (const std::string& label : labels) {
    table.Remove(label);
  }
}

bool SimulatedModule::IsPredefinedLabel(const std::string& label, LabelType type) {
  return Labels(type).IsPredefined(label);
}

bool SimulatedModule::IsPrivilegedVm(const std::string& name) {
  const std::vector<std::string>& vms = description_.privilegedVms;
  return std::find(vms.begin(), vms.end(), name) != vms.end();
}

LabelId SimulatedModule::LookupLabel(const std::string& label, LabelType type) {
  return Labels(type).IdOf(label);
}

std::string SimulatedModule::LabelName(LabelId label, LabelType type) {
  return Labels(type).NameOf(label);
}

void SimulatedModule::SetFileLabel(const std::string& path, LabelId label) {
  if (!Labels(LabelType::kObject).Defines(label)) {
    throw ModuleError(EINVAL, StrCat("no object label has the id ", label));
  }
  state_->fileLabels[path] = label;
}

LabelId SimulatedModule::FileLabel(const std::string& path) {
  const auto found = state_->fileLabels.find(path);
  return found == state_->fileLabels.end() ? LookupLabel(kUnlabelled, LabelType::kObject)
                                           : found->second;
}

}  // namespace StandIn
