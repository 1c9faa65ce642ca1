// The limit of open files, which labelling a deep tree can reach.
#pragma once

#include <functional>
#include <string>
#include <string_view>

namespace SecPolicyTool {

// The reason that `message` leaves out: labelling a tree keeps a directory open for each of its
// levels, and a directory that lies too deep is reported as "Unable to open directory DIR" alone.
// Empty for any other message, and for a DIR that lies higher than this process's limit can explain
// or that `opens` finds cannot be opened now either.
std::string DescriptorLimitReason(std::string_view message,
                                  const std::function<bool(const std::string& dir)>& opens);

// Whether this process can open the directory now.
bool OpensDirectory(const std::string& dir);

}  // namespace SecPolicyTool
