#include "tools/check/references.h"

#include <algorithm>

#include "host/module/domain_table.h"
#include "tools/check/domain_lines.h"

namespace SecPolicyTool {

using StandIn::LabelType;
using StandIn::TardiskWord;

void CheckUnusedObjects(const DefinedObjects& objects, CheckContext& context) {
  for (const auto& [name, spot] : objects) {
    if (context.references.objects.contains(name)) continue;
    if (context.module.IsPredefinedLabel(name, LabelType::kObject)) continue;
    context.findings.AddWarning(Kind::kUnusedObject, spot,
                                "no rule and no file label refers to the object \"" + name + "\"",
                                "use it, or remove its line");
  }
}

namespace {

// The domains that programs can come into.
class Reachable {
 public:
  explicit Reachable(const References& references) : references_(references) {}

  void Add(const std::string& domain) {
    if (!domains_.insert(domain).second) return;
    const auto transitions = references_.transitions.find(domain);
    if (transitions == references_.transitions.end()) return;
    for (const std::string& target : transitions->second) Add(target);
  }

  [[nodiscard]] bool Has(const std::string& domain) const { return domains_.contains(domain); }

 private:
  const References& references_;
  std::set<std::string> domains_;
};

// Adds the domains in which programs start.
void AddStarts(const CheckedDirectory& domains, CheckContext& context, Reachable& reachable) {
  reachable.Add(StandIn::kRootDomainName);
  reachable.Add(context.module.Tardisk(TardiskWord::kLaunchDomain));
  reachable.Add(context.module.Tardisk(TardiskWord::kDefaultDomain));
  for (const std::string& domain : context.references.launched) reachable.Add(domain);
  for (const CheckedFile& file : domains.files) {
    const auto id = context.module.FindDomain(file.name);
    const bool isInUse = id && context.module.GetDomainInfo(*id)->worldRefCount != 0;
    if (isInUse || IsRequiredDomain(file.name)) reachable.Add(file.name);
  }
}

bool HasRules(const CheckedFile& file) {
  const auto& lines = file.text.lines;
  return std::any_of(lines.begin(), lines.end(),
                     [](const PolicyLine& line) { return !line.words.empty(); });
}

}  // namespace

void CheckDomainUse(const CheckedDirectory& domains, CheckContext& context) {
  Reachable reachable(context.references);
  AddStarts(domains, context, reachable);
  for (const CheckedFile& file : domains.files) {
    if (IsRequiredDomain(file.name) || IsBackupName(file.name)) continue;
    if (!HasRules(file)) {
      context.findings.AddWarning(Kind::kEmptyDomain, SpotOf(file), "the domain has no rules",
                                  "write its rules, or remove the file");
    }
    if (!reachable.Has(file.name)) {
      context.findings.AddWarning(
          Kind::kUnreachableDomain, SpotOf(file),
          "no granted transition leads here from a domain in which programs run",
          "grant one (-d LABEL " + file.name + " EVENT grant), or remove the file");
    }
  }
}

}  // namespace SecPolicyTool
