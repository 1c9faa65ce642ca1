// A security module whose contents a host directory keeps.
#pragma once

#include <memory>
#include <string>

#include "host/json/text_reader.h"
#include "host/module/module_description.h"
#include "host/module/process_table.h"
#include "host/module/security_module.h"

namespace StandIn {

class StorableModule : public SecurityModule {
 public:
  // Hands what the module holds to `sink`, as JSON text in parts of some 64 KiB: the same for the
  // same contents. state_json.h says its shape. `sink` may throw.
  virtual void Save(const TextSink& sink) const = 0;

  // Takes over what another module of a like description saved to `file`. HostError, and everything
  // is as it was, when `text` is not such or does not fit the description.
  virtual void Restore(const TextReader& text, const std::string& file) = 0;
};

// The module of a host that has this description, as a kernel has it that has just been started.
// `processes` must outlive it. The description is one that ReadDescription gives, or as good.
// ModuleError when a predefined label's name will not do or there are too many.
std::unique_ptr<StorableModule> StartModule(ModuleDescription description,
                                            const ProcessTable& processes);

}  // namespace StandIn
