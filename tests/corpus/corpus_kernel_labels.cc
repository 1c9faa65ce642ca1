// The corpus's kernel, as far as files are labelled.
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <sstream>
#include <stdexcept>

#include "labels/file_label_policy.h"
#include "tardisk/tardisk_exception_rules.h"
#include "tardisk/tardisk_policy.h"
#include "tests/corpus/corpus_kernel.h"
#include "tests/corpus/corpus_texts.h"
#include "tests/support/captured.h"
#include "tests/support/refusal.h"

namespace SecPolicyTest {

using SecPolicy::ZekAccessInterfaceImpl;
using StandIn::LabelType;
using StandIn::RuleType;

namespace {

// What follows "Error: " on each line.
void AddErrors(const std::string& logged, std::vector<std::string>& records) {
  constexpr std::size_t kPrefix = sizeof "Error: " - 1;
  std::istringstream stream(logged);
  for (std::string line; std::getline(stream, line);) records.push_back(line.substr(kPrefix));
}

}  // namespace

// A file that is emptied first would be written to the disk each time.
void CorpusKernel::OverwriteTardiskFile(const std::string& text) {
  const auto size = static_cast<ssize_t>(text.size());
  if (pwrite(tardiskFile_.Get(), text.data(), text.size(), 0) != size ||
      ftruncate(tardiskFile_.Get(), size) != 0) {
    throw std::runtime_error("a policy file could not be written");
  }
}

CorpusOutcome CorpusKernel::FileLabels(const std::string& text) {
  Write(text);
  ZekAccessInterfaceImpl iface;
  SecPolicy::FileLabelPolicy policy;
  CorpusOutcome outcome;
  outcome.error =
      WithFileMark(RefusalOf([&] { policy.ParsePolicy(file_.Path(), iface); }), file_.Path());
  std::string logged;
  {
    const Captured errors(std::cerr);
    (void)RefusalOf([&] { policy.SetFileLabels(iface); });
    logged = errors.Text();
  }
  AddErrors(WithFileMark(logged, file_.Path()), outcome.records);
  const auto id = host_.Module().FileLabel("/held");
  const std::string label = host_.Module().LabelName(id, LabelType::kObject);
  if (label != kFirstLabel) outcome.records.push_back("held|" + label);
  std::sort(outcome.records.begin(), outcome.records.end());
  host_.Module().SetFileLabel("/held", firstLabel_);
  return outcome;
}

// The policy can only label what is in /tardisks, so the rules are set for a file of this root too.
void CorpusKernel::SetExceptions(const std::string& file, std::vector<std::string>& records) {
  std::map<unsigned int, std::queue<std::string>> lines;
  SecPolicy::ParseFile(file, lines);
  ZekAccessInterfaceImpl iface;
  SecPolicy::TardiskExceptionRules rules;
  for (auto& entry : lines) {
    std::queue<std::string>& words = entry.second;
    if (words.front() != "-E") break;
    words.pop();
    if (!RefusalOf([&] { rules.AddRule(entry.first, Held(), file, words, iface); }).empty()) break;
  }
  if (!RefusalOf([&] { rules.Set(iface); }).empty()) return;
  const auto transitions = host_.Module().Rules(RuleType::kTransition, 0);
  for (const StandIn::Rule& rule : transitions) {
    records.push_back(RecordOf(RuleType::kTransition, rule));
  }
  // The first domain is there for good, and so are its rules.
  if (!transitions.empty()) host_.Module().Restore(fresh_, "kernel.json");
}

CorpusOutcome CorpusKernel::Tardisk(const std::string& text) {
  Write("");
  const std::string file = root_ / "policy";
  OverwriteTardiskFile(text);
  ZekAccessInterfaceImpl iface;
  SecPolicy::TardiskPolicy policy(file);
  CorpusOutcome outcome;
  outcome.error = WithFileMark(RefusalOf([&] { policy.ParsePolicy(iface); }), file);
  const std::string refusal = RefusalOf([&] { policy.SetPolicy(iface); });
  if (!refusal.empty()) outcome.records.push_back(WithFileMark(refusal, file));
  SetExceptions(file, outcome.records);
  std::sort(outcome.records.begin(), outcome.records.end());
  return outcome;
}

}  // namespace SecPolicyTest
