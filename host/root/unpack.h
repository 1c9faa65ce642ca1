// Unpacking of one archive into the root file system.
#pragma once

#include <cstdint>
#include <string>

#include "host/archives/unpack_budget.h"
#include "host/root/image_layout.h"
#include "host/root/tree_writer.h"

namespace StandIn {

// An archive to be unpacked.
struct TardiskFile {
  int fd;             // at the file's start
  std::string name;   // in the directory of archives
  std::string shown;  // its path for messages
};

// Adds what the archive brings to `tree` and to the account in `layout`, and returns the number of
// its entries. Directories that are only implied by the names of others have mode 0755. Owners,
// times and extended attributes are not restored.
//
// Throws HostError "SHOWN: entry "NAME": TEXT" or "SHOWN: at byte N: TEXT" for everything that
// TarReader, EntryPath, HardLinkTarget and ImageLayout refuse (what concerns the target of a hard
// link begins with "hard link to "TARGET": "), and besides
//   "device nodes are not allowed in a tardisk"
//   "entries of this type are not allowed in a tardisk"
//   "a symbolic link without a target", "a symbolic link with a target of more than 4095 bytes"
//   "the name has more than N components", "the paths in the tardisks have more than N bytes
//   together", "the tardisks hold more than N entries, with the directories that names imply"
// and the errors of TreeWriter. What was unpacked until then is left.
std::uint64_t Unpack(const TardiskFile& tardisk, UnpackBudget& budget, ImageLayout& layout,
                     const TreeWriter& tree);

}  // namespace StandIn
