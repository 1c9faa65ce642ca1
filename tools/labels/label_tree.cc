#include "tools/labels/label_tree.h"

#include <filesystem>
#include <map>
#include <stdexcept>

namespace SecPolicyTool {

namespace {

namespace fs = std::filesystem;

bool IsLabelled(fs::file_type type) {
  return type == fs::file_type::regular || type == fs::file_type::directory ||
         type == fs::file_type::character || type == fs::file_type::block ||
         type == fs::file_type::fifo;
}

// The directory's entries that are labelled, by name; true for directories.
std::map<std::string, bool> EntriesOf(const std::string& dir) {
  std::error_code error;
  std::map<std::string, bool> entries;
  for (fs::directory_iterator entry(dir, error), end; !error && entry != end;
       entry.increment(error)) {
    const fs::file_type type = entry->symlink_status().type();
    if (IsLabelled(type)) entries[entry->path().filename()] = type == fs::file_type::directory;
  }
  if (error) throw std::runtime_error(dir + " cannot be listed: " + error.message());
  return entries;
}

void ForEachBelow(const std::string& dir, const std::function<void(const std::string&)>& visit) {
  const std::string above = dir.ends_with('/') ? dir : dir + "/";
  for (const auto& [name, isDirectory] : EntriesOf(dir)) {
    const std::string path = above + name;
    visit(path);
    if (isDirectory) ForEachBelow(path, visit);
  }
}

}  // namespace

void ForEachLabelled(const std::string& path, Extent extent,
                     const std::function<void(const std::string&)>& visit) {
  visit(path);
  if (extent == Extent::kTree && fs::is_directory(path)) ForEachBelow(path, visit);
}

}  // namespace SecPolicyTool
