#include "host/archives/entry_path.h"

#include <algorithm>
#include <string_view>

namespace StandIn {

namespace {

// What a path may have on Linux: NAME_MAX, and PATH_MAX without the byte that ends it.
constexpr std::size_t kMaxComponentBytes = 255;
constexpr std::size_t kMaxPathBytes = 4095;

void AppendComponent(std::string& path, std::string_view component, const std::string& noun) {
  if (component.empty() || component == ".") {
    return;
  }
  if (component == "..") {
    throw BadEntry("the " + noun + " has a \"..\" component");
  }
  if (component.size() > kMaxComponentBytes) {
    throw BadEntry("a component of the " + noun + " is longer than 255 bytes");
  }
  path += '/';
  path += component;
}

std::string Normalise(const std::string& name, const std::string& noun) {
  if (name.empty()) {
    throw BadEntry("the " + noun + " is empty");
  }
  if (name.find('\0') != std::string::npos) {
    throw BadEntry("the " + noun + " has a NUL byte");
  }
  std::string path;
  std::string_view rest = name;
  while (!rest.empty()) {
    const std::size_t end = std::min(rest.find('/'), rest.size());
    AppendComponent(path, rest.substr(0, end), noun);
    rest.remove_prefix(std::min(end + 1, rest.size()));
  }
  if (path.size() > kMaxPathBytes) {
    throw BadEntry("the " + noun + " is longer than 4095 bytes");
  }
  return path.empty() ? "/" : path;
}

}  // namespace

std::string EntryPath(const std::string& name) { return Normalise(name, "name"); }

std::string HardLinkTarget(const std::string& target) {
  if (target.starts_with('/')) {
    throw BadEntry("the target is absolute");
  }
  return Normalise(target, "target");
}

bool IsPathBelowRoot(const std::string& path) {
  try {
    return path != "/" && EntryPath(path) == path;
  } catch (const BadEntry&) {
    return false;
  }
}

std::string ParentOf(const std::string& path) {
  const std::size_t slash = path.rfind('/');
  return slash == 0 ? "/" : path.substr(0, slash);
}

}  // namespace StandIn
