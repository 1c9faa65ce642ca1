// Which words the host's kernel takes, and which ones were probably meant.
#pragma once

#include <map>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "host/module/security_module.h"

namespace SecPolicyTool {

// How much a text about a word that is not taken may cost. To look for the nearest word is costly
// where lists are long and many words are wrong.
enum class Effort {
  kExact,    // exactly what the kernel says
  kBounded,  // without the nearest word once very many were looked for
};

// Asks a module that stays as it is, and asks once for each word. Texts are the kernel's own.
class WordJudge {
 public:
  explicit WordJudge(StandIn::SecurityModule& module) : module_(module) {}

  // Why the list does not hold the word; nothing when it does.
  std::optional<std::string> Refusal(StandIn::WordList list, const std::string& word,
                                     Effort effort);
  bool IsDomain(const std::string& name);

  // A help for a word that was refused with this text: the nearest word, or else all words of a
  // list of few.
  std::string HelpFor(StandIn::WordList list, const std::string& refusal);
  std::string HelpForDomain(const std::string& name);

 private:
  struct List {
    std::unordered_map<std::string, std::optional<std::string>> refusals;
    std::vector<std::string> words;
    std::size_t looked = 0;  // how many words of the list were compared with others
  };

  List& ListOf(StandIn::WordList list);
  const std::vector<std::string>& DomainNames();

  StandIn::SecurityModule& module_;
  std::map<StandIn::WordList, List> lists_;
  std::unordered_map<std::string, bool> domains_;
  std::vector<std::string> domainNames_;
  std::unordered_map<std::string, std::string> domainHelps_;
  std::size_t lookedForDomains_ = 0;
};

}  // namespace SecPolicyTool
