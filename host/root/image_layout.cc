#include "host/root/image_layout.h"

#include <algorithm>

#include "host/archives/entry_path.h"
#include "host/text/quoted_name.h"

namespace StandIn {

namespace {

// The owner of what no archive brought; it has a place of its own before the archives.
constexpr std::size_t kMachine = 0;

}  // namespace

ImageLayout::ImageLayout() : tardisks_{""} {
  nodes_ = {{"/", {PathKind::kDirectory, kMachine}},
            {kArchivesPath, {PathKind::kDirectory, kMachine}}};
}

void ImageLayout::BeginTardisk(const std::string& name) { tardisks_.push_back(name); }

void ImageLayout::CheckName(const std::string& path, PathKind kind) {
  if (path == kArchivesPath && kind != PathKind::kDirectory) {
    throw BadEntry("only a directory may have this name: it holds the archives themselves");
  }
  if (path.starts_with(std::string(kArchivesPath) + "/")) {
    throw BadEntry("nothing may be brought here: the directory holds the archives themselves");
  }
}

std::vector<std::string> ImageLayout::BringParents(const std::string& path) {
  std::vector<std::string> missing;
  for (std::string parent = path; parent != "/";) {
    parent = ParentOf(parent);
    const auto found = nodes_.find(parent);
    if (found == nodes_.end()) {
      missing.push_back(parent);
    } else if (found->second.kind == PathKind::kDirectory) {
      break;  // those above it are there as well
    } else if (found->second.kind == PathKind::kSymlink) {
      throw BadEntry("passes through the symbolic link " + QuotedName(parent) + " of " +
                     NameOf(found->second));
    } else {
      throw BadEntry("passes through " + QuotedName(parent) + ", which is not a directory in " +
                     NameOf(found->second));
    }
  }
  std::reverse(missing.begin(), missing.end());
  for (const std::string& parent : missing) {
    nodes_.emplace(parent, Node{PathKind::kDirectory, tardisks_.size() - 1});
  }
  return missing;
}

ImageLayout::DirectoryUse ImageLayout::BringDirectory(const std::string& path) {
  const std::size_t tardisk = tardisks_.size() - 1;
  const auto [node, isNew] = nodes_.emplace(path, Node{PathKind::kDirectory, tardisk});
  if (isNew) {
    return DirectoryUse::kMake;
  }
  if (node->second.kind != PathKind::kDirectory) {
    throw BadEntry("a directory here, but something else in " + NameOf(node->second));
  }
  return node->second.tardisk == tardisk ? DirectoryUse::kSetMode : DirectoryUse::kLeave;
}

ImageLayout::FileUse ImageLayout::BringFile(const std::string& path, PathKind kind) {
  const Node brought{kind, tardisks_.size() - 1};
  const auto [node, isNew] = nodes_.emplace(path, brought);
  if (isNew) {
    return FileUse::kMake;
  }
  if (node->second.kind == PathKind::kDirectory) {
    throw BadEntry(path == "/"
                       ? "the root can only be a directory"
                       : "a directory in " + NameOf(node->second) + ", but something else here");
  }
  node->second = brought;
  return FileUse::kReplace;
}

PathKind ImageLayout::KindOfHardLink(const std::string& path, const std::string& target) const {
  const auto found = nodes_.find(target);
  if (path == target) {
    throw BadEntry("the target is the link itself");
  }
  if (found != nodes_.end() && found->second.kind == PathKind::kDirectory) {
    throw BadEntry("the target is a directory");
  }
  // An earlier archive's file would then belong to two archives.
  if (found == nodes_.end() || found->second.tardisk != tardisks_.size() - 1) {
    throw BadEntry("the archive has brought no such file before");
  }
  return found->second.kind;
}

ImageIndex ImageLayout::Index() const {
  std::vector<TardiskContent> contents;
  for (const std::string& name : tardisks_) {
    contents.push_back({name, {}});
  }
  for (const auto& [path, node] : nodes_) {
    contents[node.tardisk].paths.push_back(path);
  }
  contents.erase(contents.begin());  // the machine's
  return {std::move(contents)};
}

std::string ImageLayout::NameOf(const Node& node) const {
  return QuotedName(tardisks_[node.tardisk]);
}

}  // namespace StandIn
