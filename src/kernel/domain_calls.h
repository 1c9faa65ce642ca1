// The create-domain call, which the domain loader issues too.
#pragma once

#include <string>

#include "platform/private_calls.h"

namespace SecPolicy {

// Creates the domain and stores its id in `*id`. False, with the reason in errno, when the kernel
// refuses.
[[nodiscard]] bool CreateKernelDomain(const std::string& name, ZekCtl::Kernel::DomainOrigin origin,
                                      unsigned int* id);

}  // namespace SecPolicy
