// A second reading of policy files beyond their words: what each kind of file comes to in the small
// world, said without the library.
#pragma once

#include <string>
#include <vector>

#include "fuzz/support/plain_reader.h"

namespace Fuzz {

// A line that was taken: its number and its words, the first of which is the rule type.
struct PlainRule {
  unsigned int line = 0;
  PlainWords words;
};

// What becomes of a file: the rules up to the first bad line, and what that line is refused with.
struct PlainOutcome {
  std::vector<PlainRule> rules;
  std::string error;    // empty for none
  bool isWhole = true;  // false when only the beginning of the text is the library's own
};

// A domain file of the domain `name`.
PlainOutcome ReadDomainPlainly(const std::string& name, const PlainLines& lines);

// The printed form of its rules: type by type in byte order, each in the order of the file.
std::string PrintedPlainly(const std::vector<PlainRule>& rules);

// The numbers of two lines that grant and revoke the same capability and parameter, the first such
// pair; 0 and 0 for none.
std::pair<unsigned int, unsigned int> FirstContradiction(const std::vector<PlainRule>& rules);

// Files of objects, of file labels and of tardisks, called `file`; rules have the words alone.
PlainOutcome ReadObjectsPlainly(const std::string& file, const PlainLines& lines);
PlainOutcome ReadFileLabelsPlainly(const std::string& file, const PlainLines& lines);
PlainOutcome ReadTardiskPlainly(const std::string& file, const PlainLines& lines);

// Fails unless `found`, an exception's text or nothing, is what the outcome says.
void RequireError(const std::string& found, const PlainOutcome& expected);

}  // namespace Fuzz
