#include "tests/support/memory_host.h"

#include <fcntl.h>

namespace SecPolicyTest {

using StandIn::UniqueFd;

MemoryHost::MemoryHost(const StandIn::ModuleDescription& description)
    : MemoryHost(description, {}, "/") {}

MemoryHost::MemoryHost(const StandIn::ModuleDescription& description,
                       const StandIn::ImageIndex& index, const std::string& root)
    : module_(description, processes_),
      observed_(module_, point_),
      files_(index, UniqueFd(open(root.c_str(), O_PATH | O_CLOEXEC))),
      attached_{observed_, point_, module_, files_} {
  StandIn::Attach(&attached_);
}

MemoryHost::~MemoryHost() { StandIn::Attach(nullptr); }

}  // namespace SecPolicyTest
