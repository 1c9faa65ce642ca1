// Questions about what a domain may do, in words.
#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "host/engine/engine.h"
#include "tools/policy/policy.h"
#include "tools/query/bad_request.h"
#include "tools/query/vocabulary.h"

namespace SecPolicyTool {

// An access, a word such as "append", to a file.
struct AskedFile {
  std::string access;
  StandIn::FileObject object;
};

// What is asked: whether a rule with this key grants; or whether the domain may access a file.
struct Question {
  RuleKey key;                    // of a question about a file, of a path rule for that file
  std::optional<AskedFile> file;  // nothing for other questions
};

// What is wrong with a question.
class BadQuestion : public BadRequest {
 public:
  enum class Kind : std::uint8_t {
    kForm,  // the number of its words
    kWord,  // a word that the host or the policy does not have
  };

  BadQuestion(Kind kind, std::size_t word, const std::string& text)
      : BadRequest(text), kind_(kind), word_(word) {}

  [[nodiscard]] Kind Of() const { return kind_; }
  // The word that is wrong, from 0.
  [[nodiscard]] std::size_t Word() const { return word_; }

 private:
  Kind kind_;
  std::size_t word_;
};

// Checks the number of words, the first of which is the operation, as far as this can be done
// without knowing a host's words. Throws BadQuestion (kForm):
//   "OPERATION takes other words: FORM [or FORM]"
//   "WORD is no operation with N words (nearest: OPERATION)"
void CheckForm(const std::vector<std::string>& words);

// The file that an absolute path leads to, and its label.
using FileResolver = std::function<StandIn::FileObject(const std::string&)>;

// The question in `words`. `resolve` is handed absolute paths. Throws BadQuestion: those of
// CheckForm, and (kWord) "unknown operation "WORD" (nearest: NEAREST)", "unknown LIST "WORD"
// (nearest: NEAREST)", `unknown domain "NAME" (nearest: OTHER)`.
Question ParseQuestion(const std::vector<std::string>& words, const Vocabulary& vocabulary,
                       const FileResolver& resolve);

// The forms of questions, a line each, for help.
std::string QuestionForms();

}  // namespace SecPolicyTool
