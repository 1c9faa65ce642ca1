#include "tools/labels/label_tree.h"

#include <dirent.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstring>
#include <map>
#include <stdexcept>

#include "core/directory_stream.h"

namespace SecPolicyTool {

namespace {

using StandIn::FileTree;

bool IsLabelled(mode_t type) {
  return type == S_IFREG || type == S_IFDIR || type == S_IFCHR || type == S_IFBLK ||
         type == S_IFIFO;
}

mode_t TypeOfEntry(const FileTree& root, const std::string& path,
                   const SecPolicy::DirectoryEntry& entry) {
  if (entry.type == DT_UNKNOWN) return root.LinkType(path);
  return static_cast<mode_t>(DTTOIF(entry.type));
}

// The directory's entries that are labelled, by name; true for directories.
std::map<std::string, bool> EntriesOf(const FileTree& root, const std::string& dir,
                                      const std::string& above) {
  SecPolicy::DirectoryStream stream(root.OpenDirectory(dir));
  if (!stream.IsOpen()) {
    throw std::runtime_error(dir + " cannot be listed: " + std::strerror(errno));
  }
  std::map<std::string, bool> entries;
  while (const auto entry = stream.Next()) {
    const mode_t type = TypeOfEntry(root, above + entry->name, *entry);
    if (IsLabelled(type)) entries[entry->name] = type == S_IFDIR;
  }
  return entries;
}

void ForEachBelow(const FileTree& root, const std::string& dir,
                  const std::function<void(const std::string&)>& visit) {
  const std::string above = dir.ends_with('/') ? dir : dir + "/";
  for (const auto& [name, isDirectory] : EntriesOf(root, dir, above)) {
    const std::string path = above + name;
    visit(path);
    if (isDirectory) ForEachBelow(root, path, visit);
  }
}

}  // namespace

void ForEachLabelled(const FileTree& root, const std::string& path, Extent extent,
                     const std::function<void(const std::string&)>& visit) {
  visit(path);
  if (extent == Extent::kTree && root.IsDirectory(path)) ForEachBelow(root, path, visit);
}

}  // namespace SecPolicyTool
