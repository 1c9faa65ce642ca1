// The limit of open files, which labelling a deep tree can reach.
#pragma once

#include <string>

namespace SecPolicyTool {

// Why files could not be opened, and what to do: labelling a tree keeps a directory open for each
// of its levels, which the library's own messages do not say.
std::string DescriptorLimitReason();

}  // namespace SecPolicyTool
