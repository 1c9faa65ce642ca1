// How a fuzz target says that something does not hold.
#pragma once

#include <cstdio>
#include <cstdlib>
#include <string>

namespace Fuzz {

// Ends the process, which the fuzzer keeps the input of, when `holds` is false.
inline void Require(bool holds, const char* what) {
  if (holds) return;
  std::fprintf(stderr, "does not hold: %s\n", what);
  std::abort();
}

// The same for two texts that have to be equal, both of which are shown.
inline void RequireEqual(const std::string& found, const std::string& expected, const char* what) {
  if (found == expected) return;
  std::fprintf(stderr, "does not hold: %s\n--- found\n%s\n--- expected\n%s\n", what, found.c_str(),
               expected.c_str());
  std::abort();
}

}  // namespace Fuzz
