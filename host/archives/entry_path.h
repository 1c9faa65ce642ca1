// Where an archive's entry belongs in the root file system.
#pragma once

#include <stdexcept>
#include <string>

namespace StandIn {

// What is wrong with an entry of an archive, without saying which entry of which archive. Doesn't
// leave Assemble.
class BadEntry : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

// The path within the root file system that an entry's name stands for: "/" and the components
// joined by "/", without leading slashes, "." and empty components. "/" alone is the root itself.
// Throws BadEntry for
//   an empty name               "the name is empty"
//   a NUL byte                  "the name has a NUL byte"
//   a ".." component            "the name has a ".." component"
//   a component over 255 bytes  "a component of the name is longer than 255 bytes"
//   a path over 4095 bytes      "the name is longer than 4095 bytes"
std::string EntryPath(const std::string& name);

// The same for the target of a hard link. The texts say "target" instead of "name"; besides, for a
// target that begins with "/", "the target is absolute".
std::string HardLinkTarget(const std::string& target);

// Whether `path` could have come from EntryPath and names something below the root.
bool IsPathBelowRoot(const std::string& path);

// The path of the directory that holds `path`, which must not be "/".
std::string ParentOf(const std::string& path);

}  // namespace StandIn
