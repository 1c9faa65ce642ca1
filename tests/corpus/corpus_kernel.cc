#include "tests/corpus/corpus_kernel.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <algorithm>

#include "domain/domain_policy.h"
#include "host/module/description_json.h"
#include "labels/object_policy.h"
#include "tests/corpus/corpus_texts.h"
#include "tests/corpus/word_table.h"
#include "tests/support/refusal.h"
#include "tests/support/system_log.h"
#include "tests/support/unresolved_paths.h"

namespace SecPolicyTest {

using SecPolicy::ZekAccessInterfaceImpl;
using StandIn::LabelType;

namespace {

constexpr unsigned int kAppDomain = 1;

UnresolvedPaths unresolvedPaths;

}  // namespace

CorpusKernel::CorpusKernel()
    : host_(StandIn::ReadDescription(StandIn::DefaultDescriptionText(), "host.json"),
            StandIn::ImageIndex{{{"base.tar", {"/held", "/policy"}}}}, root_.Path()) {
  StandIn::WriteBytes(Held(), "");
  tardiskFile_ = StandIn::UniqueFd(
      open((root_ / "policy").c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, S_IRUSR | S_IWUSR));
  CaptureSystemLog(log_.Descriptor());
  host_.Add(unresolvedPaths);
  StandIn::SimulatedModule& module = host_.Module();
  for (const std::string& domain : kCorpusDomains) {
    if (!module.FindDomain(domain)) module.CreateDomain(domain, StandIn::DomainOrigin::kPolicy);
  }
  module.AddLabels(kCorpusObjects, LabelType::kObject);
  module.AddLabels({kFirstLabel}, LabelType::kObject);
  firstLabel_ = module.LookupLabel(kFirstLabel, LabelType::kObject);
  module.SetFileLabel("/held", firstLabel_);
  fresh_ = module.Save();
}

void CorpusKernel::Write(const std::string& text) {
  file_.Write(text);
  log_.Write("");
}

void CorpusKernel::AddRules(std::vector<std::string>& records) {
  for (const auto& info : ZekCtl::Security::kRuleTypes) {
    if (!info.HasDecision()) continue;
    for (const StandIn::Rule& rule : host_.Module().Rules(info.type, kAppDomain)) {
      records.push_back(RecordOf(info.type, rule));
    }
  }
}

void CorpusKernel::AddPathRules(std::vector<std::string>& records) {
  for (const StandIn::FileRule& rule : host_.Module().FileRules(kAppDomain)) {
    records.push_back("-r|" + rule.path + "|" + std::to_string(rule.permission));
  }
}

CorpusOutcome CorpusKernel::Domain(const std::string& text) {
  Write(text);
  ZekAccessInterfaceImpl iface;
  SecPolicy::DomainPolicy policy("appDom", kAppDomain);
  policy.SetPolicyFile(file_.Path());
  CorpusOutcome outcome;
  outcome.error = RefusalOf([&] { policy.ParsePolicy(iface); });
  // The rules before a bad line are checked and set all the same.
  outcome.error += RefusalOf([&] {
    policy.CheckPolicyConstraints(iface);
    policy.SetPolicy(iface);
  });
  AddRules(outcome.records);
  AddPathRules(outcome.records);
  std::sort(outcome.records.begin(), outcome.records.end());
  // The lowest free slot is the one that was freed.
  host_.Module().DestroyDomain(kAppDomain);
  host_.Module().CreateDomain("appDom", StandIn::DomainOrigin::kPolicy);
  return outcome;
}

CorpusOutcome CorpusKernel::Objects(const std::string& text) {
  Write(text);
  ZekAccessInterfaceImpl iface;
  SecPolicy::ObjectPolicy policy;
  CorpusOutcome outcome;
  outcome.error = WithFileMark(RefusalOf([&] { policy.ParsePolicy(file_.Path()); }), file_.Path());
  outcome.error += RefusalOf([&] { policy.SetObjects(iface); });
  for (const auto& [name, id] : host_.Module().Words(StandIn::WordList::kObjects)) {
    if (!host_.Module().IsPredefinedLabel(name, LabelType::kObject))
      outcome.records.push_back(name);
  }
  std::sort(outcome.records.begin(), outcome.records.end());
  return outcome;
}

}  // namespace SecPolicyTest
