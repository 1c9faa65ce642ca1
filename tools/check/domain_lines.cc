#include "tools/check/domain_lines.h"

#include <cerrno>
#include <cstring>

#include "secpolicy/secpolicy.h"
#include "tools/check/permission_words.h"
#include "tools/check/rule_helps.h"
#include "tools/check/rule_memory.h"

namespace SecPolicyTool {

namespace {

// One file's lines, from the first to the last.
class DomainFile {
 public:
  DomainFile(const CheckedFile& file, CheckContext& context)
      : file_(file), context_(context), memory_(file, context) {}

  void Check() {
    for (const PolicyLine& line : file_.text.lines) {
      if (!line.words.empty()) CheckLine(line);
    }
    memory_.NoteTransitions();
  }

 private:
  void CheckLine(const PolicyLine& line);
  void CheckKeywordRule(const PolicyLine& line, RuleType type);
  void CheckPathRule(const PolicyLine& line);
  bool CheckWord(const PolicyLine& line, const LineWord& word, const RuleWordInfo& info);
  bool CheckTarget(const PolicyLine& line, const LineWord& word);
  bool CheckDecision(const PolicyLine& line);
  std::string CheckPath(const PolicyLine& line);

  // Adds an error that a load reports while parsing. Returns false.
  bool Refuse(Kind kind, const PolicyLine& line, const Spot& spot, const std::string& cause,
              const std::string& help);
  bool RefuseToSet(Kind kind, const PolicyLine& line, const LineWord& word,
                   const std::string& cause, const std::string& help);

  const CheckedFile& file_;
  CheckContext& context_;
  RuleMemory memory_;
  bool isRefused_ = false;  // a load reads no further
};

bool DomainFile::Refuse(Kind kind, const PolicyLine& line, const Spot& spot,
                        const std::string& cause, const std::string& help) {
  const std::string text =
      TextOfRefusal([&] { SecPolicy::ThrowDomainParseError(line.number, file_.name, cause); });
  context_.findings.AddError(kind, spot, cause, text, help);
  isRefused_ = true;
  return false;
}

bool DomainFile::RefuseToSet(Kind kind, const PolicyLine& line, const LineWord& word,
                             const std::string& cause, const std::string& help) {
  const std::string text =
      TextOfRefusal([&] { SecPolicy::ThrowDomainSetError(line.number, file_.name, cause); });
  context_.findings.AddError(kind, SpotOf(file_, line, word), cause, text, help);
  return false;
}

void DomainFile::CheckLine(const PolicyLine& line) {
  const LineWord& keyword = line.words.front();
  const auto type = TypeOfKeyword(keyword.text);
  if (!type) {
    Refuse(Kind::kUnknownRuleType, line, SpotOf(file_, line, keyword),
           "invalid policy rule type (" + keyword.text + ")", HelpForType(keyword.text));
    return;
  }
  const RuleTypeInfo& info = InfoOf(*type);
  const std::size_t count = line.words.size() - 1;
  const std::size_t most = info.wordCount + 1;
  if (count > most || count < (info.HasDecision() ? most : most - 1)) {
    Refuse(Kind::kWordCount, line, SpotOf(file_, line), TextOfRefusal(SecPolicy::RuleSizeError),
           HelpForCount(info));
  } else if (info.HasDecision()) {
    CheckKeywordRule(line, *type);
  } else {
    CheckPathRule(line);
  }
}

void DomainFile::CheckKeywordRule(const PolicyLine& line, RuleType type) {
  const RuleTypeInfo& info = InfoOf(type);
  bool isGood = true;
  std::string words;
  for (std::size_t i = 0; i < info.wordCount; ++i) {
    const LineWord& word = line.words[i + 1];
    const RuleWordInfo& wordInfo = info.Words()[i];
    isGood &= wordInfo.isDomain ? CheckTarget(line, word) : CheckWord(line, word, wordInfo);
    words += word.text + " ";
  }
  isGood &= CheckDecision(line);
  if (isGood) {
    memory_.Add({type, &line, std::move(words), line.words.back().text});
  } else if (type == RuleType::kTransition) {
    // Once it is mended it probably leads there.
    context_.references.transitions[file_.name].insert(line.words[2].text);
  }
}

bool DomainFile::CheckWord(const PolicyLine& line, const LineWord& word, const RuleWordInfo& info) {
  if (!info.list) return true;
  const StandIn::WordList list = StandIn::ToModule(*info.list);
  if (list == StandIn::WordList::kObjects) context_.references.objects.insert(word.text);
  const auto refusal =
      context_.judge.Refusal(list, word.text, isRefused_ ? Effort::kBounded : Effort::kExact);
  if (!refusal) return true;
  return Refuse(Kind::kUnknownWord, line, SpotOf(file_, line, word), *refusal,
                context_.judge.HelpFor(list, *refusal));
}

bool DomainFile::CheckTarget(const PolicyLine& line, const LineWord& word) {
  if (context_.judge.IsDomain(word.text)) return true;
  return Refuse(Kind::kUnknownDomain, line, SpotOf(file_, line, word),
                "Failed to fetch domain id for: " + word.text,
                context_.judge.HelpForDomain(word.text));
}

bool DomainFile::CheckDecision(const PolicyLine& line) {
  const LineWord& word = line.words.back();
  std::string decision = word.text;
  const std::string cause = TextOfRefusal([&] { SecPolicy::IsGrant(decision); });
  if (cause.empty()) return true;
  return Refuse(Kind::kBadDecision, line, SpotOf(file_, line, word), cause,
                HelpForDecision(word.text));
}

void DomainFile::CheckPathRule(const PolicyLine& line) {
  const bool hasLetters = line.words.size() == 3;
  const std::string letters = hasLetters ? line.words.back().text : "";
  const std::string problem = PermissionProblem(letters);
  if (!problem.empty()) {
    RefuseToSet(Kind::kBadPermission, line, line.words.back(), problem,
                "write each of r, w and x at most once, or nothing for no permission");
  }
  const std::string path = CheckPath(line);
  if (problem.empty() && !path.empty()) memory_.Add({RuleType::kPath, &line, path, letters});
}

// The path as the kernel resolves it, or as written when it cannot; empty when it is refused.
std::string DomainFile::CheckPath(const PolicyLine& line) {
  const LineWord& word = line.words[1];
  const auto resolved = context_.root.Tree().Resolve(word.text);
  const std::string reason = resolved ? "" : std::strerror(errno);
  const bool isAbsolute = word.text.starts_with('/');
  if (!resolved && !isAbsolute) {
    const unsigned int domain = context_.module.FindDomain(file_.name).value_or(0);
    SecPolicy::ZekAccess_FileRule rule{};
    word.text.copy(static_cast<char*>(rule.path), sizeof rule.path - 1);
    unsigned int taken = 0;
    const std::string cause =
        TextOfRefusal([&] { SecPolicy::AddFilePolicyBatch(0, domain, &rule, 1, &taken); });
    RefuseToSet(Kind::kRelativePath, line, word, cause, "write the path from the root on");
    return {};
  }
  if (!resolved) {
    context_.findings.AddWarning(Kind::kMissingPath, SpotOf(file_, line, word),
                                 "the path cannot be resolved in the host: " + reason,
                                 "the rule is installed as written, for what may come there");
    return word.text;
  }
  if (!isAbsolute) {
    context_.findings.AddWarning(
        Kind::kRelativePath, SpotOf(file_, line, word),
        "the path leads from the loading process's own directory, wherever that is",
        "write the path from the root on");
  }
  return *resolved;
}

}  // namespace

void CheckDomainFile(const CheckedFile& file, CheckContext& context) {
  DomainFile(file, context).Check();
}

}  // namespace SecPolicyTool
