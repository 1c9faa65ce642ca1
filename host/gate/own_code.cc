#include "host/gate/own_code.h"

#include <link.h>

namespace StandIn {

std::vector<CodeRange> OwnCode() {
  std::vector<CodeRange> ranges;
  const auto collect = [](dl_phdr_info* object, std::size_t, void* result) {
    for (int i = 0; i < object->dlpi_phnum; ++i) {
      const auto& segment = object->dlpi_phdr[i];
      if (segment.p_type != PT_LOAD || (segment.p_flags & PF_X) == 0) continue;
      const std::uint64_t begin = object->dlpi_addr + segment.p_vaddr;
      static_cast<std::vector<CodeRange>*>(result)->push_back({begin, begin + segment.p_memsz});
    }
    return 0;
  };
  dl_iterate_phdr(collect, &ranges);
  return ranges;
}

}  // namespace StandIn
