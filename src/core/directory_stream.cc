#include "core/directory_stream.h"

#include <string_view>

namespace SecPolicy {

std::optional<DirectoryEntry> DirectoryStream::Next() {
  while (const dirent64* entry = readdir64(directory_.get())) {
    const std::string_view name = entry->d_name;
    if (name != "." && name != "..") return DirectoryEntry{std::string(name), entry->d_type};
  }
  return std::nullopt;
}

}  // namespace SecPolicy
