#include "tools/check/check.h"

#include <filesystem>
#include <nlohmann/json.hpp>
#include <utility>

#include "platform/tavon_strcat.h"
#include "tools/check/domain_lines.h"
#include "tools/check/error_capture.h"
#include "tools/check/findings_json.h"
#include "tools/check/label_lines.h"
#include "tools/check/object_lines.h"
#include "tools/check/references.h"
#include "tools/check/tardisk_lines.h"
#include "tools/policy/held_policy.h"
#include "tools/policy/host_work.h"
#include "tools/policy/policy_path.h"
#include "tools/policy/trial_load.h"

namespace SecPolicyTool {

using nlohmann::json;
using StandIn::HostDirectory;
using StandIn::Session;

std::string AtLine(const std::string& path, unsigned int line, const std::string& cause) {
  return Tavon::Misc::StrCat(path, ":", line, " : ", cause);
}

namespace {

DirectoryToRead Below(const PolicyFiles& policy, const char* name) {
  return {policy.path + "/" + name, policy.shown + "/" + name, false};
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

bool Exists(const std::string& path) {
  std::error_code ignored;
  return std::filesystem::exists(path, ignored);
}

CheckedPolicy ReadAll(const PolicyFiles& place, Findings& findings) {
  CheckedPolicy policy;
  policy.objects = ReadDirectory(Below(place, "objects"), findings);
  policy.domains = ReadDirectory(Below(place, "domains"), findings);
  policy.fileLabels = ReadDirectory(Below(place, "fileLabels"), findings);
  if (Exists(kTardiskPolicyDir)) {
    policy.tardisks = ReadDirectory({kTardiskPolicyDir, kTardiskPolicyDir, true}, findings);
  }
  const DirectoryToRead own = Below(place, "tardisks");
  if (own.path != kTardiskPolicyDir && Exists(own.path)) {
    findings.AddWarning(Kind::kSkippedEntry, SpotOf(own.shown),
                        std::string("a load reads tardisk policy from the host's own ") +
                            kTardiskPolicyDir + ", and not from here",
                        "its lines are checked all the same; pack the files into their tardisks");
    policy.otherTardisks = ReadDirectory(own, findings);
  }
  CheckTopEntries(place.path, place.shown, findings);
  return policy;
}

// In the host, after the load.
json CheckAfter(const std::vector<std::string>& errors, const PolicyFiles& place,
                const StandIn::ImageIndex& image, StandIn::SecurityModule& module) {
  Findings findings;
  const CheckedPolicy policy = ReadAll(place, findings);
  const LoadErrors load(errors);
  WordJudge judge(module);
  References references;
  const bool isTerminated = load.IsTerminated();
  CheckContext context{module, image, load, isTerminated, judge, findings, references};
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
  return {files, ToJson(std::move(findings).Sorted())};
}

}  // namespace

CheckReport CheckWholePolicy(HostDirectory host, const std::string& dir) {
  const PolicyPath location = LocatePolicy(dir);
  const PolicyFiles place = location.Files();
  const StandIn::ImageIndex image = ImageOf(host);
  ErrorCapture errors;
  const auto load = [&](Session&) {
    errors.Begin();
    try {
      LoadOnTrial(location);
    } catch (...) {
      errors.End();
      throw;
    }
  };
  HostWork outcome =
      WorkInHost(std::move(host), TrialOptions(location), load, [&](Session& session) {
        errors.End();
        return CheckAfter(errors.Errors(), place, image, session.Module());
      });
  return {FindingsOfJson(outcome.result.at(1)), outcome.result.at(0)};
}

std::vector<Finding> CheckPolicy(HostDirectory host, const std::string& dir) {
  return CheckWholePolicy(std::move(host), dir).findings;
}

}  // namespace SecPolicyTool
