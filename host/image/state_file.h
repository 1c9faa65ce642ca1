// The security module's state on disk, and the lock on a host directory.
#pragma once

#include <sys/stat.h>

#include <optional>
#include <string>

#include "host/image/file_io.h"
#include "host/image/host_directory.h"
#include "host/image/unique_fd.h"

namespace StandIn {

enum class LockMode { kShared, kExclusive };

// kernel.json of a host directory. Its content is a text here.
//
// Whoever reads holds a Lock, whoever writes an exclusive one; the calls below don't see to that
// themselves, since most need the lock for longer than one call. A process that ends, in whatever
// way, gives its lock up and leaves the old content or the new one whole.
class StateFile {
 public:
  // `dirFd` is a descriptor of the host directory (O_PATH will do) that outlives this object;
  // `dirPath` is for messages.
  StateFile(int dirFd, std::string dirPath);
  explicit StateFile(const HostDirectory& host) : StateFile(host.Descriptor(), host.Path()) {}

  // Holds kernel.lock, which is made when it is not there, as long as it lives. A second Lock of
  // the same process is a stranger to the first: taking an exclusive one while another is held
  // waits for ever.
  //
  // Not for use across fork(): a child's copy of a Lock guards nothing, and its end changes
  // nothing.
  class Lock {
   public:
    // Waits until the lock is free. Throws HostError "DIR/kernel.lock: cannot be opened: REASON" or
    // "...: cannot be locked: REASON".
    Lock(const StateFile& state, LockMode mode);
    ~Lock();
    Lock(const Lock&) = delete;
    Lock& operator=(const Lock&) = delete;

   private:
    UniqueFd fd_;
    pid_t owner_;
  };

  // Which content a file has, as far as that can be told without reading it.
  struct Version {
    bool exists = false;
    ino_t inode = 0;
    off_t size = 0;
    long long modifiedNs = 0;
    long long changedNs = 0;

    bool operator==(const Version&) const = default;
  };

  // The version that is there now. The file last read or written through this object is kept open,
  // so that its inode number isn't given to another: two versions are equal only if nobody wrote
  // between them. Throws HostError "DIR/kernel.json: cannot be read: REASON".
  [[nodiscard]] Version CurrentVersion() const;
  [[nodiscard]] bool ChangedSince(const Version& version) const {
    return CurrentVersion() != version;
  }

  // The content; nothing when there is no file. Errors of ReadFileIfThere.
  [[nodiscard]] std::optional<std::string> Read();

  // Replaces the content. Errors of ReplaceFile.
  void Write(const std::string& text);

  // Removes the file, if it is there. Throws HostError "DIR/kernel.json: cannot be removed:
  // REASON".
  void Remove();

 private:
  // Keeps the file that is there now open.
  void Pin();

  DirectoryRef dir_;
  UniqueFd pinned_;
};

}  // namespace StandIn
