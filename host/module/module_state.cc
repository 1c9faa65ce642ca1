#include "host/module/module_state.h"

namespace StandIn {

ModuleState::ModuleState(const ModuleDescription& description)
    : domains(description.limits.domains),
      labels{LabelTable("domain label", description.limits.labels, description.labels[0]),
             LabelTable("object label", description.limits.labels, description.labels[1])},
      worlds(description.worlds) {}

}  // namespace StandIn
