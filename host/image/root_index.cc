#include "host/image/root_index.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <utility>

#include "host/image/beneath.h"
#include "host/image/image_file.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

RootIndex::RootIndex(const ImageIndex& index, UniqueFd root) : root_(std::move(root)) {
  tardiskOfPath_ = {{"/", ""}, {kArchivesPath, ""}};
  for (const TardiskContent& content : index.tardisks) {
    tardiskOfPath_.emplace(std::string(kArchivesPath) + "/" + content.name, "");
    for (const std::string& path : content.paths) {
      tardiskOfPath_.emplace(path, content.name);
    }
  }
}

std::optional<RootIndex> RootIndex::Load(const HostDirectory& host) {
  UniqueFd root;
  std::string failure;
  const std::optional<ImageIndex> index = ReadImage(host, [&] {
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
  return RootIndex(*index, std::move(root));
}

std::optional<std::string> RootIndex::PathOf(dev_t device, ino_t inode) const {
  const Files& files = AllFiles();
  const auto found = files.byInode.find(inode);
  if (device != files.device || found == files.byInode.end()) {
    return std::nullopt;
  }
  return found->second.path;
}

std::string RootIndex::TardiskOf(ino_t inode) const {
  const Files& files = AllFiles();
  const auto found = files.byInode.find(inode);
  return found != files.byInode.end() ? found->second.tardisk : "";
}

const RootIndex::Files& RootIndex::AllFiles() const {
  if (!files_) {
    struct stat status {};
    ::fstat(root_.Get(), &status);
    files_.emplace(Files{status.st_dev, {}});
    for (const auto& [path, tardisk] : tardiskOfPath_) {
      LookUp(path, tardisk, *files_);
    }
  }
  return *files_;
}

// Not by fstatat: it would follow symbolic links on the way, and see what has been mounted over a
// path in place of the file that the image has there.
void RootIndex::LookUp(const std::string& path, const std::string& tardisk, Files& files) const {
  const UniqueFd fd = OpenBeneath(root_.Get(), path, O_PATH | O_NOFOLLOW);
  struct stat status;
  if (fd.IsOpen() && ::fstat(fd.Get(), &status) == 0) {
    files.byInode.emplace(status.st_ino, Found{path, tardisk});
  }
}

}  // namespace StandIn
