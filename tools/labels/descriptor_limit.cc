#include "tools/labels/descriptor_limit.h"

#include <sys/resource.h>

namespace SecPolicyTool {

std::string DescriptorLimitReason() {
  rlimit limit{};
  getrlimit(RLIMIT_NOFILE, &limit);
  return "labelling a tree keeps a directory open for each of its levels, and the limit of open "
         "files is " +
         std::to_string(limit.rlim_cur) + "; raise it (ulimit -n)";
}

}  // namespace SecPolicyTool
