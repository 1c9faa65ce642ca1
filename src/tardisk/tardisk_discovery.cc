#include "tardisk/tardisk_discovery.h"

#include <cerrno>
#include <memory>

#include "core/diagnostics.h"
#include "core/directory_stream.h"
#include "core/file_access.h"
#include "tardisk/backing_tardisk.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;

namespace {

// The next regular file's name; entries of other kinds are logged, all with the same word.
std::optional<std::string> NextRegularFile(DirectoryStream& directory) {
  while (auto entry = directory.Next()) {
    if (entry->type == DT_REG) return std::move(entry->name);
    SecpolicyError("Skipping directory " + entry->name);
  }
  return std::nullopt;
}

// Every accepted policy is asked afresh, also after a match.
bool HasPolicyFor(const std::string& tardisk, const std::list<TardiskPolicy*>& policies) {
  bool found = false;
  for (TardiskPolicy* policy : policies) found |= policy->GetBackingTardiskPath() == tardisk;
  return found;
}

// Appends the file's policy and strikes its tardisk from `remaining`, or logs why it is ignored.
void SortPolicyFile(const std::string& path, std::list<TardiskPolicy*>& withPolicy,
                    std::list<std::string>& remaining) {
  auto policy = std::make_unique<TardiskPolicy>(path);
  const std::string tardisk = policy->GetBackingTardiskPath();
  if (tardisk.empty()) {
    LogNoBackingTardisk(path);
  } else if (HasPolicyFor(tardisk, withPolicy)) {
    SecpolicyError("More than one exception specification for tardisk " + tardisk);
    SecpolicyError("Ignoring " + path);
  } else {
    withPolicy.push_back(policy.get());
    static_cast<void>(policy.release());  // the list owns it now
    remaining.remove(tardisk);
  }
}

}  // namespace

void GetAllTardisks(std::list<std::string>& tardisks) {
  DirectoryStream directory(OpenRootDirectory(kTardiskDir));
  if (!directory.IsOpen()) {
    throw TavonException(std::string("Could not open tardisk dir ") + kTardiskDir);
  }
  while (const auto name = NextRegularFile(directory)) tardisks.push_back(kTardiskDir + *name);
}

void GetTardiskLists(std::string policyDir, std::list<TardiskPolicy*>& withPolicy,
                     std::list<std::string>& withoutPolicy) {
  std::list<std::string> remaining;
  GetAllTardisks(remaining);
  errno = 0;
  DirectoryStream directory(OpenRootDirectory(policyDir));
  if (!directory.IsOpen()) {
    if (errno != ENOENT) {
      throw TavonException("Unable to open policy directory for tardisks " + policyDir);
    }
    // Without a tardisk policy no tardisk is labelled, so the mounted ones are not handed on.
    SecpolicyInfo("Skipping tardisk policy as " + policyDir + " does not exist");
    return;
  }
  while (const auto name = NextRegularFile(directory)) {
    SortPolicyFile(policyDir + "/" + *name, withPolicy, remaining);
  }
  withoutPolicy.splice(withoutPolicy.end(), remaining);
}

}  // namespace SecPolicy
