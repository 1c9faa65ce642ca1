// Where this process's own code lies.
#pragma once

#include <cstdint>
#include <vector>

namespace StandIn {

// Addresses from `begin` up to but not including `end`.
struct CodeRange {
  std::uint64_t begin;
  std::uint64_t end;
};

// The executable segments of the program and of every library that is loaded now.
std::vector<CodeRange> OwnCode();

}  // namespace StandIn
