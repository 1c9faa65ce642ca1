#include "tools/check/check.h"

#include <utility>

#include "host/doors/library_use.h"
#include "platform/tavon_strcat.h"
#include "tools/check/domain_lines.h"
#include "tools/check/label_lines.h"
#include "tools/check/object_lines.h"
#include "tools/check/references.h"
#include "tools/check/tardisk_lines.h"
#include "tools/policy/library_output.h"
#include "tools/policy/policy_path.h"

namespace SecPolicyTool {

using StandIn::HostDirectory;

std::string AtLine(const std::string& path, unsigned int line, const std::string& cause) {
  return Tavon::Misc::StrCat(path, ":", line, " : ", cause);
}

namespace {

DirectoryToRead Below(const PolicyFiles& policy, const char* name) {
  return {policy.tree, policy.path + "/" + name, policy.shown + "/" + name, false};
}

struct CheckedPolicy {
  CheckedDirectory objects;
  CheckedDirectory domains;
  CheckedDirectory fileLabels;
  CheckedDirectory tardisks;       // those that a load reads
  CheckedDirectory otherTardisks;  // those of the policy directory

  [[nodiscard]] std::vector<const CheckedDirectory*> All() const {
    return {&objects, &domains, &fileLabels, &tardisks, &otherTardisks};
  }
};

// Whether both are the same directory: the host's own, and not one of that path elsewhere.
bool IsHostsOwn(const DirectoryToRead& directory, const StandIn::FileTree& root) {
  return directory.path == kTardiskPolicyDir && &directory.tree == &root;
}

CheckedPolicy ReadAll(const PolicyFiles& place, const StandIn::FileTree& root, Findings& findings) {
  CheckedPolicy policy;
  policy.objects = ReadDirectory(Below(place, "objects"), findings);
  policy.domains = ReadDirectory(Below(place, "domains"), findings);
  policy.fileLabels = ReadDirectory(Below(place, "fileLabels"), findings);
  if (root.Exists(kTardiskPolicyDir)) {
    policy.tardisks = ReadDirectory({root, kTardiskPolicyDir, kTardiskPolicyDir, true}, findings);
  }
  const DirectoryToRead own = Below(place, "tardisks");
  if (!IsHostsOwn(own, root) && own.tree.Exists(own.path)) {
    findings.AddWarning(Kind::kSkippedEntry, SpotOf(own.shown),
                        std::string("a load reads tardisk policy from the host's own ") +
                            kTardiskPolicyDir + ", and not from here",
                        "its lines are checked all the same; pack the files into their tardisks");
    policy.otherTardisks = ReadDirectory(own, findings);
  }
  CheckTopEntries(place, findings);
  return policy;
}

// After the load, in the same use of the library.
CheckReport CheckAfter(StandIn::LoadEnd end, ErrorList& errors, const PolicyFiles& place,
                       StandIn::Kernel& kernel) {
  Findings findings;
  StandIn::SecurityModule& module = kernel.Module();
  const CheckedPolicy policy = ReadAll(place, kernel.Files().Tree(), findings);
  // What the check itself has the library try reports nothing.
  const LoadErrors load(std::exchange(errors.Errors(), {}));
  WordJudge judge(module);
  References references;
  CheckContext context{
      module, kernel.Files(), load,      errors.Shortages(), end == StandIn::LoadEnd::kTerminated,
      judge,  findings,       references};
  references.objects.insert(module.Tardisk(StandIn::TardiskWord::kDefaultLabel));
  CheckDomainNames(policy.domains, context);
  for (const CheckedFile& file : policy.domains.files) CheckDomainFile(file, context);
  CheckTardiskFiles(policy.tardisks, TardiskFiles::kLoaded, context);
  CheckTardiskFiles(policy.otherTardisks, TardiskFiles::kToBePacked, context);
  CheckLabelFiles(policy.fileLabels, context);
  CheckDomainUse(policy.domains, context);
  CheckUnusedObjects(CheckObjectFiles(policy.objects, context), context);
  load.AddUnexplained(policy.All(), findings);
  std::size_t files = 0;
  for (const CheckedDirectory* directory : policy.All()) files += directory->files.size();
  return {std::move(findings).Sorted(), files};
}

}  // namespace

CheckReport CheckWholePolicy(HostDirectory host, const std::string& dir) {
  const PolicyPath location = LocatePolicy(dir);
  StandIn::Kernel kernel(std::move(host), {.state = StandIn::KernelOptions::State::kScratch});
  const PolicyFiles place = location.Files(kernel);
  RequireDirectory(place);
  ErrorList errors;
  const StandIn::LibraryUse use(kernel, errors, location.MachinePath());
  const StandIn::LoadEnd end = StandIn::RunLoad(location.path);
  return CheckAfter(end, errors, place, kernel);
}

std::vector<Finding> CheckPolicy(HostDirectory host, const std::string& dir) {
  return CheckWholePolicy(std::move(host), dir).findings;
}

}  // namespace SecPolicyTool
