// The directory on disk that stands for a machine.
#pragma once

#include <chrono>
#include <string>

#include "host/files/file_io.h"
#include "host/files/unique_fd.h"

namespace StandIn {

// What a host directory holds.
inline constexpr char kDescriptionFile[] = "host.json";  // limits, words, labels
inline constexpr char kTardiskDirectory[] = "tardisks";  // the archives
inline constexpr char kRootDirectory[] = "root";         // the root file system made of them
inline constexpr char kNewRootDirectory[] = "root.new";  // the same in the making
inline constexpr char kIndexFile[] = "image.json";       // which archive brought which path
inline constexpr char kStateFile[] = "kernel.json";      // what the security module holds
inline constexpr char kLockFile[] = "kernel.lock";       // held by whoever changes these

// How long whoever changes a host waits for another one to end, unless told otherwise.
inline constexpr std::chrono::seconds kLockWait(30);

// Whether root changes a host in which another user can exchange files under its hands.
enum class OtherWriters { kRefused, kTrusted };

// How a host is changed.
struct ChangeOptions {
  std::chrono::seconds wait = kLockWait;  // for the host's lock
  OtherWriters otherWriters = OtherWriters::kRefused;
};

// An open host directory. Everything in it is reached through one descriptor, so that it stays
// reachable from a process that has changed its root directory.
class HostDirectory {
 public:
  // Makes `path` a host directory: the directory and its parents as far as they are missing, an
  // empty tardisks/, and host.json with `descriptionText`, which is not looked at here. Other files
  // that are there already stay. Throws HostError "DIR is a host directory already", or "FILE:
  // cannot be made: REASON" and the errors of ReplaceFile; directories made until then stay.
  static void Create(const std::string& path, const std::string& descriptionText);

  // Opens a host directory. Throws HostError "DIR: cannot be opened: REASON", or "DIR is not a host
  // directory: it has no host.json"; when it is, or may be, one yet to be made, followed by
  // "; make one with "secpolicy host init DIR"".
  explicit HostDirectory(const std::string& path);

  // As given, but without slashes at its end.
  [[nodiscard]] const std::string& Path() const { return path_; }
  // An O_PATH descriptor, valid as long as this object, close-on-exec.
  [[nodiscard]] int Descriptor() const { return fd_.Get(); }
  // Both of them; valid as long as this object.
  [[nodiscard]] DirectoryRef Ref() const { return {fd_.Get(), path_}; }

  // How changes through this object are made; see StateFile::Lock.
  void SetChanges(const ChangeOptions& options) { changes_ = options; }
  [[nodiscard]] const ChangeOptions& Changes() const { return changes_; }

  // The content of host.json. Errors of ReadFile.
  [[nodiscard]] std::string DescriptionText() const { return ReadFile(Ref(), kDescriptionFile); }

 private:
  std::string path_;
  UniqueFd fd_;
  ChangeOptions changes_;
};

}  // namespace StandIn
