// A line of a policy file with a mark below what is meant.
#pragma once

#include <string>

#include "tools/policy/terminal.h"

namespace SecPolicyTool {

// Two lines of equal indentation for a terminal; of a long line, only what is near the mark is
// shown, between "...".
struct LineExcerpt {
  TerminalText text;
  std::string mark;  // blanks, then "^", then "~" below the rest of what is meant
};

// `column` counts bytes from 1; `length` in bytes, at least the one byte is marked. Both may lead
// beyond the line's end.
LineExcerpt ExcerptOf(const std::string& line, unsigned int column, unsigned int length);

}  // namespace SecPolicyTool
