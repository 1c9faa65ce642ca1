// Making a directory the root directory of this process.
#pragma once

#include <string>
#include <vector>

#include "host/files/directory.h"

namespace StandIn {

// Makes the directory behind `root` the root and the current directory of this process, for good.
// The directories `visible`, absolute paths, are to be found inside under the same paths, whatever
// the image has there; the directories above them are made in the image where they are missing.
//
// Uses the rights of the process where it has them, else those of a user namespace of its own.
// Throws HostError, which says what is missing, when neither can be had; the process may then be in
// namespaces of its own, but sees the same files as before.
void ChangeRoot(const DirectoryRef& root, const std::vector<std::string>& visible);

}  // namespace StandIn
