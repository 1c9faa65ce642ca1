// The files of a policy directory, as a check reads them.
#pragma once

#include <string>
#include <vector>

#include "tools/policy/policy_files.h"
#include "tools/policy/policy_text.h"

namespace SecPolicyTool {

struct CheckedFile {
  std::string name;
  std::string path;   // as a load names it
  std::string shown;  // as the user does
  PolicyText text;
};

struct CheckedDirectory {
  std::string path;
  std::string shown;
  std::vector<CheckedFile>
      files;  // those that can be read, in the order in which a load reads them
};

// What is to be read of a sub-directory.
struct DirectoryToRead {
  const StandIn::FileTree& tree;
  std::string path;
  std::string shown;
  // In the order in which the directory lists them, and not by name; entries that are passed over
  // are errors then. Both are so of tardisk policy.
  bool isTardiskPolicy = false;
};

class Findings;

// Reads a sub-directory, and adds what there is to be said about its entries and about its files
// as such: unreadable, skipped-entry, backup-file, long-line, nul-byte, tab, carriage-return.
CheckedDirectory ReadDirectory(const DirectoryToRead& directory, Findings& findings);

// Adds the entries of the policy directory itself that a load does not read, as warnings, except
// those whose names begin with a dot.
void CheckTopEntries(const PolicyFiles& policy, Findings& findings);

// Whether a name is one that editors and package managers give to copies.
bool IsBackupName(const std::string& name);

}  // namespace SecPolicyTool
