// The lines of domain files.
#pragma once

#include "tools/check/check_context.h"

namespace SecPolicyTool {

// Adds what is wrong with each line of the domain's file, each word by itself, and with its rules
// among each other; and notes what it refers to.
void CheckDomainFile(const CheckedFile& file, CheckContext& context);

// Adds the domains that the kernel refuses to make, and those that are missing without which a load
// is terminated. Makes, in the module, those that the load did not come to.
void CheckDomainNames(const CheckedDirectory& domains, CheckContext& context);

// Whether a load is terminated without a domain of that name.
bool IsRequiredDomain(const std::string& name);

}  // namespace SecPolicyTool
