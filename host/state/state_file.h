// The security module's state on disk, and the lock on a host directory.
#pragma once

#include <sys/stat.h>

#include <optional>
#include <string>

#include "host/files/file_io.h"
#include "host/files/unique_fd.h"
#include "host/state/host_directory.h"

namespace StandIn {

// kernel.json of a host directory. Its content is a text here.
//
// Whoever writes holds a Lock; the calls below don't see to that themselves, since most need the
// lock for longer than one call. Whoever reads needs none: the content is replaced as a whole. A
// process that ends, in whatever way, gives its lock up and leaves the old content or the new one
// whole.
class StateFile {
 public:
  // `dirFd` is a descriptor of the host directory (O_PATH will do) that outlives this object;
  // `dirPath` is for messages.
  StateFile(int dirFd, std::string dirPath, const ChangeOptions& changes);
  explicit StateFile(const HostDirectory& host)
      : StateFile(host.Descriptor(), host.Path(), host.Changes()) {}

  // Holds kernel.lock, which is made when it is not there, as long as it lives. Only those who may
  // write to the host directory may open that file, so that nobody else can hold them up. A second
  // Lock of the same process is a stranger to the first.
  //
  // Not for use across fork(): a child's copy of a Lock guards nothing, and its end changes
  // nothing.
  class Lock {
   public:
    // Waits until the lock is free, but no longer than `changes.wait`. Throws HostError
    //   that of RequireNoOtherWriters for the host directory, unless they are trusted
    //   "DIR/kernel.lock: cannot be opened: REASON", "...: cannot be locked: REASON"
    //   "DIR/kernel.lock: not a regular file"
    //   "DIR/kernel.lock: has other names, which are not this host's"
    //   "DIR/kernel.lock: is locked by HOLDER, which kept it for the N seconds of waiting; "--wait
    //   SECONDS" waits longer"   HOLDER is "process PID", or "another process" when that is unknown
    explicit Lock(const StateFile& state);
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

  // The content, which stays readable until the next call of Open, Read or Write; nothing when
  // there is no file. Errors of OpenFileIfThere.
  [[nodiscard]] std::optional<TextReader> Open();
  // The whole content. Errors of ReadFileIfThere.
  [[nodiscard]] std::optional<std::string> Read();
  // The version of what Open or Read returned or Write wrote last.
  [[nodiscard]] const Version& LastVersion() const { return last_; }

  // Replaces the content. Errors of ReplaceFile.
  void Write(const TextWriter& write);
  void Write(const std::string& text);

  // Removes the file, if it is there. Throws HostError "DIR/kernel.json: cannot be removed:
  // REASON".
  void Remove();

 private:
  static Version VersionOf(const struct stat& status);
  // Keeps the file `fd` open, if it is one, as the one that was read or written last.
  void Pin(UniqueFd fd);

  DirectoryRef dir_;
  ChangeOptions changes_;
  UniqueFd pinned_;
  Version last_;
};

}  // namespace StandIn
