// The files of a policy directory.
#pragma once

#include <string>
#include <vector>

#include "host/root/file_tree.h"
#include "host/root/image_index.h"

namespace SecPolicyTool {

// A host's own policy directory, in the host.
inline constexpr char kSystemPolicyDir[] = "/etc/olvane/secpolicy";
// Where every load reads the policy of the tardisks, whatever directory it is given.
using StandIn::kTardiskPolicyDir;

// A policy directory: the tree that it lies in, its path there, and what its user calls it. The
// tree has to live as long as this object.
struct PolicyFiles {
  const StandIn::FileTree& tree;
  std::string path;
  std::string shown;
};

// The names of the policy files in `dir`, in the order of a load. None when it cannot be listed.
std::vector<std::string> PolicyFileNames(const StandIn::FileTree& tree, const std::string& dir);

}  // namespace SecPolicyTool
