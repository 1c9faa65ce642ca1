#include "host/engine/paths.h"

namespace StandIn {

std::string NormalPath(const std::string& path) {
  std::string normal;
  for (const char c : path) {
    if (c != '/' || !normal.ends_with('/')) normal += c;
  }
  if (normal.size() > 1 && normal.ends_with('/')) normal.pop_back();
  return normal;
}

std::vector<std::string> WithParents(const std::string& path) {
  std::vector<std::string> paths{"/"};
  for (std::size_t slash = 0; slash != std::string::npos && path.size() > 1;) {
    slash = path.find('/', slash + 1);
    paths.push_back(path.substr(0, slash));
  }
  return paths;
}

bool IsAtOrBelow(const std::string& path, const std::string& directory) {
  if (!path.starts_with(directory)) return false;
  return directory == "/" || path.size() == directory.size() || path[directory.size()] == '/';
}

}  // namespace StandIn
