#include "core/file_access.h"

#include <fcntl.h>

#include <ios>

namespace SecPolicy {

DIR* OpenPolicyDirectory(const std::string& path) { return opendir(path.c_str()); }

DIR* OpenRootDirectory(const std::string& path) { return opendir(path.c_str()); }

std::filebuf OpenPolicyFile(const std::string& path) {
  std::filebuf file;
  file.open(path, std::ios::in);
  return file;
}

int OpenTardiskPolicyFile(const std::string& path) {
  return open(path.c_str(), O_RDONLY | O_CLOEXEC);
}

}  // namespace SecPolicy
