// The doors to files and directories. Their results are the caller's to close.
#pragma once

#include <dirent.h>

#include <fstream>
#include <string>

namespace SecPolicy {

// Each of the first three is null or closed where it fails, with the reason in errno, which stays
// as it is where it succeeds.

// A directory of policy files.
[[nodiscard]] DIR* OpenPolicyDirectory(const std::string& path);
// A directory of the root file system: one whose entries are labelled, or that of the tardisks.
[[nodiscard]] DIR* OpenRootDirectory(const std::string& path);
// A policy file, to be read as text.
[[nodiscard]] std::filebuf OpenPolicyFile(const std::string& path);
// A tardisk's policy file in the root file system, to be asked for its attributes: a descriptor, or
// -1.
[[nodiscard]] int OpenTardiskPolicyFile(const std::string& path);

}  // namespace SecPolicy
