#include "tools/query/question.h"

#include <algorithm>
#include <array>
#include <optional>

#include "host/module/nearest_word.h"
#include "host/module/word_lists.h"
#include "host/text/escaped.h"
#include "tools/policy/unknown_word.h"
#include "tools/query/paths.h"

namespace SecPolicyTool {

using StandIn::Escaped;
using Words = std::vector<std::string>;

namespace {

// An operation, which together with the number of its words says which rules decide.
struct Operation {
  const char* word;
  RuleType type;
  std::vector<std::size_t> positions;  // where the words of the rule's key stand in the question
  const char* form;
};

const std::array<Operation, 6>& Operations() {
  static const std::array<Operation, 6> kOperations{{
      {"syscall", RuleType::kSyscall, {1}, "syscall NAME"},
      {"capability", RuleType::kCapability, {1}, "capability NAME"},
      {"capability", RuleType::kCapabilityParam, {1, 2}, "capability NAME PARAM"},
      {"create", RuleType::kFileCreation, {2, 3, 1}, "create TYPE PARENT LABEL"},
      {"socket", RuleType::kUnixSocket, {2, 1}, "socket TYPE LABEL"},
      {"transition", RuleType::kTransition, {2, 3, 1}, "transition EVENT LABEL TARGET"},
  }};
  return kOperations;
}

// Any other operation is an access to what has a label.
const Operation& AccessOperation() {
  static const Operation kAccess{nullptr, RuleType::kObjectAccess, {1, 0}, "ACCESS LABEL"};
  return kAccess;
}

struct PathOperation {
  const char* word;
  std::uint32_t permission;
};
constexpr std::array<PathOperation, 3> kPathOperations{
    {{"read", 0x1}, {"write", 0x2}, {"exec", 0x10}}};

bool IsPathQuestion(const Words& words) {
  const bool isNamed = std::any_of(Operations().begin(), Operations().end(),
                                   [&](const Operation& each) { return words[0] == each.word; });
  return !isNamed && words.size() == 2 && words[1].starts_with('/');
}

[[noreturn]] void RefuseForm(const std::string& text) {
  throw BadQuestion(BadQuestion::Kind::kForm, 0, text);
}

std::uint32_t PathPermission(const std::string& word) {
  for (const PathOperation& each : kPathOperations) {
    if (word == each.word) return each.permission;
  }
  RefuseForm("there is no operation " + Escaped(word).Text() +
             " on a path; there are read, write and exec");
}

// The operation that the words mean, unless it is one on a path.
const Operation& OperationOf(const Words& words) {
  std::string forms;
  for (const Operation& each : Operations()) {
    if (words[0] != each.word) continue;
    if (words.size() == each.positions.size() + 1) return each;
    forms += (forms.empty() ? "" : " or ") + std::string(each.form);
  }
  if (!forms.empty()) RefuseForm(words[0] + " takes other words: " + forms);
  return AccessOperation();
}

bool Holds(const Words& list, const std::string& word) {
  return std::find(list.begin(), list.end(), word) != list.end();
}

// " (nearest: OPERATION)": what is no access was perhaps to be one of the others.
std::string NearestText(const std::string& word, Words known) {
  for (const Operation& each : Operations()) known.emplace_back(each.word);
  const auto nearest = StandIn::NearestWord(word, known);
  return nearest && *nearest != word ? " (nearest: " + Escaped(*nearest).Text() + ")" : "";
}

// What is wrong with the word for that place of a rule; nothing when it will do.
std::optional<std::string> ProblemOf(const std::string& word, std::size_t position, RuleType type,
                                     const RuleWordInfo& info, const Vocabulary& vocabulary) {
  if (!info.list) {
    const bool isDomain = type == RuleType::kTransition;
    if (!isDomain || Holds(vocabulary.domains, word)) return std::nullopt;
    return UnknownWordText("domain", word, vocabulary.domains);
  }
  const Words& list = vocabulary.lists.at(*info.list);
  if (Holds(list, word)) return std::nullopt;
  return position == 0
             ? "unknown operation \"" + Escaped(word).Text() + "\"" + NearestText(word, list)
             : StandIn::UnknownWordText(*info.list, word, list);
}

}  // namespace

void CheckForm(const Words& words) {
  if (IsPathQuestion(words)) {
    PathPermission(words[0]);
    return;
  }
  const bool isNamed = OperationOf(words).word != nullptr;
  if (!isNamed && words.size() != 2) {
    RefuseForm(Escaped(words[0]).Text() + " is no operation with " +
               std::to_string(words.size() - 1) + " words" + NearestText(words[0], {}));
  }
}

Question ParseQuestion(const Words& words, const Vocabulary& vocabulary,
                       const PathResolver& resolve) {
  CheckForm(words);
  if (IsPathQuestion(words)) {
    return {{RuleType::kPath, {NormalPath(resolve(words[1]))}, 0}, PathPermission(words[0])};
  }
  const Operation& operation = OperationOf(words);
  const RuleTypeInfo& type = InfoOf(operation.type);
  RuleKey key{operation.type, {}, 0};
  std::array<std::optional<std::string>, 4> problems;
  for (std::size_t i = 0; i < type.words.size(); ++i) {
    const std::size_t position = operation.positions[i];
    key.words.push_back(words[position]);
    problems.at(position) =
        ProblemOf(words[position], position, operation.type, type.words[i], vocabulary);
  }
  for (std::size_t position = 0; position < problems.size(); ++position) {
    const auto& problem = problems.at(position);
    if (problem) throw BadQuestion(BadQuestion::Kind::kWord, position, *problem);
  }
  return {std::move(key), 0};
}

std::string QuestionForms() {
  std::string forms = "  read|write|exec PATH\n  ";
  forms += AccessOperation().form;
  for (const Operation& each : Operations()) forms += std::string("\n  ") + each.form;
  return forms;
}

}  // namespace SecPolicyTool
