#include "tools/check/tardisk_lines.h"

#include <algorithm>
#include <optional>

#include "host/module/module_error.h"
#include "secpolicy/secpolicy.h"

namespace SecPolicyTool {

namespace {

constexpr char kException[] = "-E";

// The tardisk that brought the file, as a load names it; empty when none did.
std::string BackingTardisk(const CheckedFile& file, const StandIn::RootIndex& root) {
  const std::string path = root.Tree().ResolvedOrSame(file.path);
  for (const StandIn::TardiskContent& tardisk : root.Image().tardisks) {
    if (std::binary_search(tardisk.paths.begin(), tardisk.paths.end(), path)) {
      return std::string(StandIn::kArchivesPath) + "/" + tardisk.name;
    }
  }
  return {};
}

class TardiskFile {
 public:
  // `tardisk` is empty for a file that no load takes into account.
  TardiskFile(const CheckedFile& file, std::string tardisk, CheckContext& context)
      : file_(file),
        loaded_(std::string(kTardiskPolicyDir) + "/" + file.name),
        tardisk_(std::move(tardisk)),
        context_(context) {}

  void Check() {
    for (const PolicyLine& line : file_.text.lines) {
      if (!line.words.empty()) CheckLine(line);
    }
  }

 private:
  void CheckLine(const PolicyLine& line);
  void CheckDomain(const PolicyLine& line, const LineWord& domain);
  void CheckLabel(const PolicyLine& line, const LineWord& label);
  void Refuse(Kind kind, const PolicyLine& line, const Spot& spot, const std::string& cause,
              const std::string& help);

  const CheckedFile& file_;
  std::string loaded_;  // the file as a load names it
  std::string tardisk_;
  CheckContext& context_;
  bool hasException_ = false;
};

void TardiskFile::Refuse(Kind kind, const PolicyLine& line, const Spot& spot,
                         const std::string& cause, const std::string& help) {
  const std::string text =
      TextOfRefusal([&] { SecPolicy::ThrowDomainParseError(line.number, loaded_, cause); });
  context_.findings.AddError(kind, spot, cause, text, help);
}

void TardiskFile::CheckLine(const PolicyLine& line) {
  const LineWord& type = line.words.front();
  if (type.text != kException) {
    Refuse(Kind::kUnknownRuleType, line, SpotOf(file_, line, type),
           "invalid tardisk policy rule type (" + type.text + ")", "the one rule type here is -E");
    return;
  }
  if (hasException_) {
    Refuse(Kind::kSecondException, line, SpotOf(file_, line),
           "Only one rule of this type is allowed", "keep one -E line");
    return;
  }
  hasException_ = true;
  if (line.words.size() != 3) {
    Refuse(Kind::kWordCount, line, SpotOf(file_, line), TextOfRefusal(SecPolicy::RuleSizeError),
           "write: -E LABEL DOMAIN");
    return;
  }
  CheckDomain(line, line.words[2]);
  CheckLabel(line, line.words[1]);
}

void TardiskFile::CheckDomain(const PolicyLine& line, const LineWord& domain) {
  context_.references.launched.insert(domain.text);
  if (context_.judge.IsDomain(domain.text)) return;
  Refuse(Kind::kUnknownDomain, line, SpotOf(file_, line, domain),
         "Failed to fetch domain id for " + domain.text, context_.judge.HelpForDomain(domain.text));
}

void TardiskFile::CheckLabel(const PolicyLine& line, const LineWord& label) {
  context_.references.objects.insert(label.text);
  const auto refusal =
      context_.judge.Refusal(StandIn::WordList::kObjects, label.text, Effort::kExact);
  if (!refusal) return;
  const std::string help = context_.judge.HelpFor(StandIn::WordList::kObjects, *refusal);
  const Spot spot = SpotOf(file_, line, label);
  if (tardisk_.empty()) {
    context_.findings.AddWarning(Kind::kUndefinedTardiskLabel, spot, *refusal, help);
    return;
  }
  // A load looks at the label only when it sets it.
  const std::string cause = TextOfRefusal([&] {
    ZekCtl::Security::ZekAccessInterfaceImpl iface;
    iface.LookupLabel(label.text, ZekCtl::Security::kObjectLabel);
  });
  context_.findings.AddError(Kind::kUndefinedTardiskLabel, spot, cause,
                             AtLine(loaded_, line.number, "Tardisk: " + tardisk_ + " : " + cause),
                             help);
}

// The tardisk of a file that a load reads; says so when the file does not count.
std::string CountedTardisk(const CheckedFile& file, std::map<std::string, std::string>& fileOf,
                           CheckContext& context) {
  std::string tardisk = BackingTardisk(file, context.root);
  if (tardisk.empty()) {
    context.findings.AddError(Kind::kNoBackingTardisk, SpotOf(file),
                              "the file comes from no tardisk, and a load ignores it",
                              "No backing tardisk for policy file " + file.path,
                              "pack it into the tardisk that it is about");
    return tardisk;
  }
  const auto [first, isNew] = fileOf.emplace(tardisk, file.shown);
  if (!isNew) {
    context.findings.AddError(Kind::kDuplicateTardiskPolicy, SpotOf(file),
                              "the tardisk " + tardisk + " has the policy file " + first->second +
                                  " already, and a load ignores this one",
                              "More than one exception specification for tardisk " + tardisk,
                              "keep one file in each tardisk");
  }
  return tardisk;
}

}  // namespace

void CheckTardiskFiles(const CheckedDirectory& tardisks, TardiskFiles files,
                       CheckContext& context) {
  std::map<std::string, std::string> fileOf;
  for (const CheckedFile& file : tardisks.files) {
    const std::string tardisk =
        files == TardiskFiles::kLoaded ? CountedTardisk(file, fileOf, context) : std::string();
    TardiskFile(file, tardisk, context).Check();
  }
}

}  // namespace SecPolicyTool
