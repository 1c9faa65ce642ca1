#include "host/root/root_index.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <tuple>
#include <utility>

#include "host/module/module_error.h"
#include "host/root/beneath.h"
#include "host/root/image_file.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

std::optional<RootIndex> RootIndex::Load(const HostDirectory& host,
                                         const std::function<void()>& readRest) {
  UniqueFd root;
  std::string failure;
  std::optional<ImageIndex> index = ReadImage(host, [&] {
    readRest();
    // Missing without an index too, and for a moment while the host is assembled.
    try {
      root = OpenDirectory(host.Ref(), kRootDirectory);
      failure.clear();
    } catch (const HostError& problem) {
      failure = problem.what();
    }
  });
  if (!index) {
    return std::nullopt;
  }
  if (!failure.empty()) {
    throw HostError(failure);
  }
  return RootIndex(std::move(*index), std::move(root));
}

std::optional<std::string> RootIndex::PathOf(dev_t device, ino_t inode) const {
  const Files& files = AllFiles();
  const auto found = files.byInode.find(inode);
  if (device != files.device || found == files.byInode.end()) {
    return std::nullopt;
  }
  return std::string(found->second.path);
}

std::string RootIndex::TardiskOf(ino_t inode) const {
  if (!files_) {
    const Files& policies = PolicyFiles();
    const auto policy = policies.byInode.find(inode);
    if (policy != policies.byInode.end()) return std::string(policy->second.tardisk);
  }
  const Files& files = AllFiles();
  const auto found = files.byInode.find(inode);
  return found != files.byInode.end() ? std::string(found->second.tardisk) : std::string();
}

RootIndex::Files RootIndex::NoFiles() const {
  struct stat status {};
  ::fstat(tree_.Root(), &status);
  return {status.st_dev, {}};
}

const RootIndex::Files& RootIndex::AllFiles() const {
  if (!files_) {
    Files files = NoFiles();
    for (const Found& file : AllPaths()) {
      if (const auto status = StatusOf(file)) files.byInode.emplace(status->st_ino, file);
    }
    files_.emplace(std::move(files));
  }
  return *files_;
}

const RootIndex::Files& RootIndex::PolicyFiles() const {
  if (!policyFiles_) {
    const std::string above = std::string(kTardiskPolicyDir) + "/";
    Files files = NoFiles();
    for (const TardiskContent& content : image_.tardisks) {
      for (const std::string& path : content.paths) {
        if (!path.starts_with(above)) continue;
        const Found file{path, content.name};
        const auto status = StatusOf(file);
        if (status && status->st_nlink == 1) files.byInode.emplace(status->st_ino, file);
      }
    }
    policyFiles_.emplace(std::move(files));
  }
  return *policyFiles_;
}

std::vector<RootIndex::Found> RootIndex::AllPaths() const {
  ownPaths_ = {"/", kArchivesPath};
  for (const TardiskContent& content : image_.tardisks) {
    ownPaths_.push_back(std::string(kArchivesPath) + "/" + content.name);
  }
  std::vector<Found> paths;
  for (const std::string& path : ownPaths_) paths.push_back({path, ""});
  for (const TardiskContent& content : image_.tardisks) {
    for (const std::string& path : content.paths) paths.push_back({path, content.name});
  }
  // Of a path that has both, the host's own comes first, and counts.
  std::sort(paths.begin(), paths.end(), [](const Found& a, const Found& b) {
    return std::tie(a.path, a.tardisk) < std::tie(b.path, b.tardisk);
  });
  return paths;
}

// Not by fstatat: it would follow symbolic links on the way, and see what has been mounted over a
// path in place of the file that the image has there.
std::optional<struct stat> RootIndex::StatusOf(const Found& file) const {
  const UniqueFd fd = OpenBeneath(tree_.Root(), std::string(file.path), O_PATH | O_NOFOLLOW);
  if (!fd.IsOpen() && (errno == EMFILE || errno == ENFILE || errno == ENOMEM)) {
    throw ModuleError(
        errno, std::string("the files of the host cannot be looked up: ") + std::strerror(errno));
  }
  struct stat status {};
  if (!fd.IsOpen() || ::fstat(fd.Get(), &status) != 0) return std::nullopt;
  return status;
}

}  // namespace StandIn
