// What files of lines share.
#pragma once

#include <string>
#include <vector>

#include "tests/corpus/corpus.h"

namespace SecPolicyTest {

using Words = std::vector<std::string>;

// Where messages place the line that a case is about.
inline const std::string kInDomain = "Error in parsing policy for domain: appDom: " + kLine + " : ";
inline const std::string kInTardisk =
    "Error in parsing policy for domain: " + kFile + ": " + kLine + " : ";
inline const std::string kAtLine = kFile + ":" + kLine + " : ";

inline const std::string kWrongCount = "incorrect number of arguments for this rule type";

// A line that ends its file.
inline CorpusLine BadLine(const Words& words, const std::string& error) {
  return {words, error, "", true};
}

// The words `rest` behind `first`.
inline Words Behind(const std::string& first, Words rest) {
  rest.insert(rest.begin(), first);
  return rest;
}

}  // namespace SecPolicyTest
