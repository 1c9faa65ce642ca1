#include "tools/query/statements.h"

#include <algorithm>
#include <array>

#include "host/module/word_lists.h"
#include "tools/policy/unknown_word.h"

namespace SecPolicyTool {

using StandIn::WordList;
using Words = std::vector<std::string>;

namespace {

struct StatementForm {
  const char* word;
  StatementKind kind;
  std::size_t fewest;  // words, with this one
  std::size_t most;    // 0: as many as the question needs
  const char* form;
};
constexpr std::array<StatementForm, 4> kForms{{
    {"may", StatementKind::kMay, 4, 0, "may DOMAIN OPERATION OBJECT..."},
    {"never", StatementKind::kNever, 4, 0, "never DOMAIN OPERATION OBJECT..."},
    {"reaches", StatementKind::kReaches, 3, 4, "reaches FROM TO [EVENT]"},
    {"unreachable", StatementKind::kUnreachable, 3, 4, "unreachable FROM TO [EVENT]"},
}};

// A problem with the word of that number.
struct BadStatement {
  std::size_t word;
  std::string text;
};

const StatementForm& FormOf(const Words& words) {
  const auto* const form =
      std::find_if(kForms.begin(), kForms.end(),
                   [&](const StatementForm& each) { return words[0] == each.word; });
  if (form == kForms.end()) {
    Words known;
    for (const StatementForm& each : kForms) known.emplace_back(each.word);
    throw BadStatement{0, UnknownWordText("statement", words[0], known)};
  }
  if (words.size() < form->fewest || (form->most != 0 && words.size() > form->most)) {
    throw BadStatement{0, words[0] + " takes other words: " + form->form};
  }
  return *form;
}

void RequireDomain(const Words& words, std::size_t at, const Vocabulary& vocabulary) {
  const Words& domains = vocabulary.domains;
  if (std::find(domains.begin(), domains.end(), words[at]) == domains.end()) {
    throw BadStatement{at, UnknownWordText("domain", words[at], domains)};
  }
}

void RequireEvent(const Words& words, std::size_t at, const Vocabulary& vocabulary) {
  const Words& events = vocabulary.lists.at(WordList::kTransitionEvents);
  if (std::find(events.begin(), events.end(), words[at]) == events.end()) {
    throw BadStatement{at,
                       StandIn::UnknownWordText(WordList::kTransitionEvents, words[at], events)};
  }
}

std::string Joined(const Words& words) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : " ") + word;
  return text;
}

Question QuestionIn(const Words& words, const Vocabulary& vocabulary, const FileResolver& resolve) {
  constexpr std::size_t kFirst = 2;
  try {
    return ParseQuestion({words.begin() + kFirst, words.end()}, vocabulary, resolve);
  } catch (const BadQuestion& problem) {
    throw BadStatement{kFirst + problem.Word(), problem.what()};
  }
}

Statement ParseStatement(const Words& words, const Vocabulary& vocabulary,
                         const FileResolver& resolve) {
  Statement statement;
  statement.kind = FormOf(words).kind;
  statement.text = Joined(words);
  statement.domain = words[1];
  RequireDomain(words, 1, vocabulary);
  if (statement.kind == StatementKind::kMay || statement.kind == StatementKind::kNever) {
    statement.question = QuestionIn(words, vocabulary, resolve);
    return statement;
  }
  RequireDomain(words, 2, vocabulary);
  statement.target = words[2];
  if (words.size() > 3) {
    RequireEvent(words, 3, vocabulary);
    statement.event = words[3];
  }
  return statement;
}

}  // namespace

StatementFile ParseStatements(const PolicyText& text, const Vocabulary& vocabulary,
                              const FileResolver& resolve) {
  StatementFile file;
  for (const PolicyLine& line : text.lines) {
    Words words;
    for (const LineWord& word : line.words) words.push_back(word.text);
    if (line.whole.size() > kLongestLine) {
      file.problems.push_back(
          {line.number, 1, "the line is longer than 1023 bytes; what is behind it is not read"});
      continue;
    }
    if (words.empty()) continue;
    try {
      file.statements.push_back(ParseStatement(words, vocabulary, resolve));
      file.statements.back().line = line.number;
    } catch (const BadStatement& problem) {
      file.problems.push_back({line.number, line.words[problem.word].column, problem.text});
    }
  }
  return file;
}

std::string StatementForms() {
  std::string forms;
  for (const StatementForm& each : kForms) {
    forms += (forms.empty() ? "  " : "\n  ") + std::string(each.form);
  }
  return forms;
}

}  // namespace SecPolicyTool
