// Files of the policy directory and of the kernel's root.
#include <fcntl.h>
#include <ext/stdio_filebuf.h>

#include <cerrno>
#include <ios>

#include "core/file_access.h"
#include "host/doors/library_use.h"

namespace SecPolicy {

using StandIn::FileTree;
using StandIn::LibraryUse;
using StandIn::UniqueFd;

namespace {

// Without a use of the library, as for the reader alone, files are the machine's.
const FileTree& Root() {
  LibraryUse* use = LibraryUse::Current();
  return use == nullptr ? FileTree::Machine() : use->UsedKernel().Files().Tree();
}

const FileTree& TreeOfPolicy(const std::string& path) {
  LibraryUse* use = LibraryUse::Current();
  return use == nullptr || use->IsOnMachine(path) ? FileTree::Machine() : Root();
}

}  // namespace

DIR* OpenPolicyDirectory(const std::string& path) { return TreeOfPolicy(path).OpenDirectory(path); }

DIR* OpenRootDirectory(const std::string& path) {
  DIR* directory = Root().OpenDirectory(path);
  LibraryUse* use = LibraryUse::Current();
  if (directory == nullptr && use != nullptr) use->NoteFailure(errno);
  return directory;
}

std::filebuf OpenPolicyFile(const std::string& path) {
  UniqueFd fd = TreeOfPolicy(path).Open(path, O_RDONLY);
  if (!fd.IsOpen()) return {};
  __gnu_cxx::stdio_filebuf<char> file(fd.Release(), std::ios::in);
  return file;
}

int OpenTardiskPolicyFile(const std::string& path) { return Root().Open(path, O_RDONLY).Release(); }

}  // namespace SecPolicy
