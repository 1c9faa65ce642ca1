// The files of a policy directory.
#pragma once

#include <string>
#include <vector>

namespace SecPolicyTool {

// A host's own policy directory, in the host.
inline constexpr char kSystemPolicyDir[] = "/etc/olvane/secpolicy";
// Where every load reads the policy of the tardisks, whatever directory it is given.
inline constexpr char kTardiskPolicyDir[] = "/etc/olvane/secpolicy/tardisks";

// A policy directory: its path in the host, and what its user calls it.
struct PolicyFiles {
  std::string path;
  std::string shown;
};

// The names of the policy files in `dir`, in the order of a load. None when it cannot be listed.
std::vector<std::string> PolicyFileNames(const std::string& dir);

// A path by which the kernel knows a file: without links. As it is when there is no such file.
std::string WithoutLinks(const std::string& path);

}  // namespace SecPolicyTool
