#include "tools/query/question.h"

#include <algorithm>
#include <array>
#include <optional>

#include "host/engine/accesses.h"
#include "host/module/nearest_word.h"
#include "host/module/word_lists.h"
#include "host/text/escaped.h"
#include "tools/policy/unknown_word.h"

namespace SecPolicyTool {

using StandIn::Escaped;
using Words = std::vector<std::string>;

namespace {

constexpr std::size_t kMostQuestionWords = ZekCtl::Security::kMostRuleWords + 1;

// The rule type that a question asks for is found by its operation and the number of its words.
bool HasOperation(const RuleTypeInfo& info, const std::string& word) {
  return info.operation != nullptr && word == info.operation;
}

// The form of a question: "create TYPE PARENT LABEL".
std::string FormOf(const RuleTypeInfo& info) {
  std::array<std::string, kMostQuestionWords> parts{info.operation == nullptr ? ""
                                                                              : info.operation};
  for (const RuleWordInfo& word : info.Words()) parts.at(word.questionPosition) = word.questionWord;
  std::string form;
  for (const std::string& part : parts) {
    if (!part.empty()) form += (form.empty() ? "" : " ") + part;
  }
  return form;
}

// Any operation that no type claims is an access to a label.
constexpr RuleType kOtherOperations = RuleType::kObjectAccess;

// "create PATH" is an access to a file, although "create" begins another question.
bool IsFileQuestion(const Words& words) {
  if (words.size() != 2 || !words[1].starts_with('/')) return false;
  const bool isNamed =
      std::any_of(kRuleTypes.begin(), kRuleTypes.end(),
                  [&](const RuleTypeInfo& info) { return HasOperation(info, words[0]); });
  return !isNamed || StandIn::PermissionFor(words[0]).has_value();
}

[[noreturn]] void RefuseForm(const std::string& text) {
  throw BadQuestion(BadQuestion::Kind::kForm, 0, text);
}

// The type that the words ask for, unless they ask for a file.
RuleType TypeAskedFor(const Words& words) {
  std::string forms;
  for (const RuleTypeInfo& info : kRuleTypes) {
    if (!HasOperation(info, words[0])) continue;
    if (words.size() == info.wordCount + 1) return info.type;
    forms += (forms.empty() ? "" : " or ") + FormOf(info);
  }
  if (!forms.empty()) RefuseForm(words[0] + " takes other words: " + forms);
  return kOtherOperations;
}

bool Holds(const Words& list, const std::string& word) {
  return std::find(list.begin(), list.end(), word) != list.end();
}

// " (nearest: OPERATION)": what is no access was perhaps to be one of the others.
std::string NearestText(const std::string& word, Words known) {
  for (const RuleTypeInfo& info : kRuleTypes) {
    if (info.operation != nullptr) known.emplace_back(info.operation);
  }
  const auto nearest = StandIn::NearestWord(word, known);
  return nearest && *nearest != word ? " (nearest: " + Escaped(*nearest).Text() + ")" : "";
}

// What is wrong with the word for an access; nothing when it will do.
std::optional<std::string> AccessProblem(const std::string& word, const Vocabulary& vocabulary) {
  const Words& accesses = vocabulary.lists.at(StandIn::WordList::kObjectAccesses);
  if (Holds(accesses, word)) return std::nullopt;
  return "unknown operation \"" + Escaped(word).Text() + "\"" + NearestText(word, accesses);
}

// What is wrong with the word for that place of a rule; nothing when it will do.
std::optional<std::string> ProblemOf(const std::string& word, const RuleWordInfo& info,
                                     const Vocabulary& vocabulary) {
  if (info.isDomain && !Holds(vocabulary.domains, word)) {
    return UnknownWordText("domain", word, vocabulary.domains);
  }
  if (!info.list) return std::nullopt;
  if (info.questionPosition == 0) return AccessProblem(word, vocabulary);
  const StandIn::WordList which = StandIn::ToModule(*info.list);
  const Words& list = vocabulary.lists.at(which);
  if (Holds(list, word)) return std::nullopt;
  return StandIn::UnknownWordText(which, word, list);
}

Question FileQuestion(const Words& words, const Vocabulary& vocabulary,
                      const FileResolver& resolve) {
  // What path rules decide on may be asked even where the host has no such word for labels.
  const auto problem =
      StandIn::PermissionFor(words[0]) ? std::nullopt : AccessProblem(words[0], vocabulary);
  if (problem) throw BadQuestion(BadQuestion::Kind::kWord, 0, *problem);
  StandIn::FileObject object = resolve(words[1]);
  RuleKey key{RuleType::kPath, {object.path}, 0};
  return {std::move(key), AskedFile{words[0], std::move(object)}};
}

}  // namespace

void CheckForm(const Words& words) {
  if (IsFileQuestion(words)) return;
  if (TypeAskedFor(words) == kOtherOperations && words.size() != 2) {
    RefuseForm(Escaped(words[0]).Text() + " is no operation with " +
               std::to_string(words.size() - 1) + " words" + NearestText(words[0], {}));
  }
}

Question ParseQuestion(const Words& words, const Vocabulary& vocabulary,
                       const FileResolver& resolve) {
  CheckForm(words);
  if (IsFileQuestion(words)) return FileQuestion(words, vocabulary, resolve);
  RuleKey key{TypeAskedFor(words), {}, 0};
  std::array<std::optional<std::string>, kMostQuestionWords> problems;
  for (const RuleWordInfo& info : InfoOf(key.type).Words()) {
    const std::string& word = words[info.questionPosition];
    key.words.push_back(word);
    problems.at(info.questionPosition) = ProblemOf(word, info, vocabulary);
  }
  for (std::size_t position = 0; position < problems.size(); ++position) {
    const auto& problem = problems.at(position);
    if (problem) throw BadQuestion(BadQuestion::Kind::kWord, position, *problem);
  }
  return {std::move(key), std::nullopt};
}

std::string QuestionForms() {
  std::string forms = "  ACCESS PATH";
  for (const RuleTypeInfo& info : kRuleTypes) {
    if (info.HasDecision()) forms += "\n  " + FormOf(info);
  }
  return forms;
}

}  // namespace SecPolicyTool
