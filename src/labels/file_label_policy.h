// The labels that policy files give to files and directory trees.
#pragma once

#include <cstdint>
#include <deque>
#include <string>

#include "secpolicy/secpolicy.h"

namespace SecPolicy {

// Collects mappings from path to label, in the order in which they are read, and applies them.
class FileLabelPolicy {
 public:
  struct FileLabel {
    std::string path;  // of a tree: without the final "/*"
    std::string label;
    bool recursive;    // the path names a tree
    std::string file;  // the policy file that holds the mapping, and the line in it
    std::uint32_t line;
  };

  // Appends the mappings of the policy file at `path`. Throws at the first bad line: path + ":" +
  // line + " : " + "incorrect no of parameters" or "Unrecognized format for file/dir
  // specification"; the kernel-access library's text for an unknown label. The mappings of the
  // lines before stay.
  void ParsePolicy(std::string path, ZekAccessInterfaceImpl& iface);

  // Applies the mappings in order and forgets each after its attempt, whatever that throws; what is
  // no TavonException leaves the mappings behind it to the next call. A failure is logged, with the
  // mapping's file and line in front, and the next one is applied. Throws "There was a failure in
  // setting file labels" if any failed.
  void SetFileLabels(ZekAccessInterfaceImpl& iface);

 private:
  std::deque<FileLabel> labels_;
};

}  // namespace SecPolicy
