#include "host/root/unpack.h"

#include <algorithm>
#include <utility>

#include "host/archives/entry_path.h"
#include "host/archives/tar_reader.h"
#include "host/text/quoted_name.h"

namespace StandIn {

namespace {

constexpr mode_t kImpliedDirectoryMode = 0755;
constexpr std::size_t kMaxSymlinkBytes = 4095;

PathKind PathKindOf(EntryKind kind) {
  switch (kind) {
    case EntryKind::kDirectory:
      return PathKind::kDirectory;
    case EntryKind::kSymlink:
      return PathKind::kSymlink;
    default:
      return PathKind::kOther;
  }
}

void CheckKind(const TarEntry& entry) {
  if (entry.kind == EntryKind::kDevice) {
    // An ordinary user could not make them.
    throw BadEntry("device nodes are not allowed in a tardisk");
  }
  if (entry.kind == EntryKind::kOther) {
    throw BadEntry("entries of this type are not allowed in a tardisk");
  }
  if (entry.kind == EntryKind::kSymlink && entry.target.empty()) {
    throw BadEntry("a symbolic link without a target");
  }
  if (entry.kind == EntryKind::kSymlink && entry.target.size() > kMaxSymlinkBytes) {
    throw BadEntry("a symbolic link with a target of more than 4095 bytes");
  }
}

class Unpacker {
 public:
  Unpacker(TarReader& reader, UnpackBudget& budget, ImageLayout& layout, const TreeWriter& tree)
      : reader_(reader), budget_(budget), layout_(layout), tree_(tree) {}

  void UnpackEntry() {
    const TarEntry& entry = reader_.Entry();
    const std::string path = EntryPath(entry.name);
    CheckKind(entry);
    ImageLayout::CheckName(path, PathKindOf(entry.kind));
    TakePath(path);
    MakeParents(path);
    if (entry.kind == EntryKind::kDirectory) {
      UnpackDirectory(path, entry.mode);
    } else {
      UnpackFile(path, entry);
    }
  }

 private:
  // The entry itself was counted by the reader.
  void TakePath(const std::string& path) {
    const auto depth = std::count(path.begin(), path.end(), '/');
    if (!budget_.AllowsDepth(static_cast<std::uint64_t>(depth))) throw BadEntry(budget_.TooDeep());
    if (!budget_.TakePath(path)) throw BadEntry(budget_.TooLongPaths());
  }

  // All are counted before the first is made.
  void MakeParents(const std::string& path) {
    const std::vector<std::string> parents = layout_.BringParents(path);
    for (const std::string& parent : parents) {
      if (!budget_.TakeEntry()) throw BadEntry(budget_.TooManyEntries());
      TakePath(parent);
    }
    for (const std::string& parent : parents) tree_.MakeDirectory(parent, kImpliedDirectoryMode);
  }

  void UnpackDirectory(const std::string& path, mode_t mode) {
    switch (layout_.BringDirectory(path)) {
      case ImageLayout::DirectoryUse::kMake:
        tree_.MakeDirectory(path, mode);
        break;
      case ImageLayout::DirectoryUse::kSetMode:
        tree_.SetDirectoryMode(path, mode);
        break;
      case ImageLayout::DirectoryUse::kLeave:
        break;
    }
  }

  void UnpackFile(const std::string& path, const TarEntry& entry) {
    if (entry.kind == EntryKind::kHardLink) {
      UnpackHardLink(path, entry.target);
      return;
    }
    MakeRoomFor(path, PathKindOf(entry.kind));
    if (entry.kind == EntryKind::kSymlink) {
      tree_.MakeSymlink(path, entry.target);
    } else if (entry.kind == EntryKind::kFifo) {
      tree_.MakeFifo(path, entry.mode);
    } else {
      UnpackContent(path, entry);
    }
  }

  void UnpackHardLink(const std::string& path, const std::string& targetName) {
    const auto [target, kind] = FindTarget(path, targetName);
    MakeRoomFor(path, kind);
    tree_.MakeHardLink(path, target);
  }

  [[nodiscard]] std::pair<std::string, PathKind> FindTarget(const std::string& path,
                                                            const std::string& name) const {
    try {
      const std::string target = HardLinkTarget(name);
      return {target, layout_.KindOfHardLink(path, target)};
    } catch (const BadEntry& problem) {
      throw BadEntry("hard link to " + QuotedName(name) + ": " + problem.what());
    }
  }

  void MakeRoomFor(const std::string& path, PathKind kind) {
    if (layout_.BringFile(path, kind) == ImageLayout::FileUse::kReplace) {
      tree_.Remove(path);
    }
  }

  void UnpackContent(const std::string& path, const TarEntry& entry) {
    NewFile file = tree_.MakeFile(path);
    reader_.ReadContent(
        [&](std::uint64_t offset, std::string_view bytes) { file.WriteAt(offset, bytes); });
    file.Finish(entry.size, entry.mode);
  }

  TarReader& reader_;
  UnpackBudget& budget_;
  ImageLayout& layout_;
  const TreeWriter& tree_;
};

}  // namespace

std::uint64_t Unpack(const TardiskFile& tardisk, UnpackBudget& budget, ImageLayout& layout,
                     const TreeWriter& tree) {
  TarReader reader(tardisk.fd, tardisk.shown, budget);
  Unpacker unpacker(reader, budget, layout, tree);
  layout.BeginTardisk(tardisk.name);
  std::uint64_t entries = 0;
  while (reader.Next()) {
    ++entries;
    try {
      unpacker.UnpackEntry();
    } catch (const BadEntry& problem) {
      reader.RefuseEntry(problem.what());
    }
  }
  return entries;
}

}  // namespace StandIn
