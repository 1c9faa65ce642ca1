// Absolute paths as path rules compare them.
#pragma once

#include <string>
#include <vector>

namespace StandIn {

// `path` without doubled slashes and without a slash at its end.
std::string NormalPath(const std::string& path);

// "/", then the directories on the way to `path`, then `path`, which is a normal one.
std::vector<std::string> WithParents(const std::string& path);

// Whether `path` is `directory` or lies below it, component by component. Both are normal paths.
bool IsAtOrBelow(const std::string& path, const std::string& directory);

}  // namespace StandIn
