// Files that a verb is asked to write.
#pragma once

#include <string>

namespace SecPolicyTool {

// Gives the file at `path` the content `text`, whole or not at all: a file that is there keeps its
// content until then. A symbolic link stays one, and the file behind it is written.
//
// Throws StandIn::HostError "PATH: cannot be written: REASON", and "PATH: not a regular file" for a
// directory, a device or a pipe, which would have to go to make room for the file.
void WriteOutputFile(const std::string& path, const std::string& text);

}  // namespace SecPolicyTool
