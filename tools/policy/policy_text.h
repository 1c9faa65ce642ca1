// Policy files as their authors see them: words with the columns that they stand in.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "core/policy_lines.h"
#include "host/root/file_tree.h"
#include "tools/policy/policy.h"

namespace SecPolicyTool {

struct LineWord {
  std::string text;
  unsigned int column = 0;  // in bytes, from 1
};

// A line as the library reads it.
struct PolicyLine {
  unsigned int number = 0;      // from 1
  std::string whole;            // from its first to its last byte, also those that are not read
  std::vector<LineWord> words;  // of what is read: to a NUL byte, and at most kLongestLine bytes
};

// What the library's reader takes of a line; a longer one is the last that is read of its file.
using SecPolicy::kLongestLine;

struct PolicyText {
  std::vector<PolicyLine> lines;  // all that are read, blank ones too
  std::size_t hiddenLines = 0;    // how many a line that is too long hides below it
};

// The words of a line before its "#", by the library's grammar.
std::vector<LineWord> WordsOf(std::string_view line);

// `content` of a policy file, read by the library's grammar.
PolicyText ReadPolicyText(std::string_view content);

// The same of a file. Throws std::runtime_error "Unable to open policy file " + path, as a load
// reports it.
PolicyText ReadPolicyFile(const StandIn::FileTree& tree, const std::string& path);

// The lines of a file; none of one that cannot be opened.
std::vector<PolicyLine> PolicyLines(const StandIn::FileTree& tree, const std::string& path);

// Where a line of `file` begins: at its first word.
Place PlaceOf(const SharedName& file, const PolicyLine& line);

}  // namespace SecPolicyTool
