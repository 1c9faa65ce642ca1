// What is run again and again while one thing after the other fails.
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "tests/faults/load_phase.h"

namespace SecPolicyFaults {

// Which rules say what is due.
enum class Family : std::uint8_t {
  kLoad,     // LoadPolicy
  kStage,    // a stage of it, called by itself
  kDisplay,  // what prints
  kCall,     // everything else: the first failure is the caller's
};

enum class HostKind : std::uint8_t { kGood, kBad, kExample };

struct Scenario {
  std::string name;
  HostKind host = HostKind::kGood;
  Family family = Family::kCall;
  // Not watched; brings the kernel to where `run` begins.
  std::function<void()> prepare = {};
  std::function<std::string()> run = {};
  std::string policyDir = {};
  Phase first = Phase::kStart;  // of a stage
  Phase behind = Phase::kDone;  // the phase that would follow
  // What a private call's refusal is due to throw; {reason} stands for the reason.
  std::string refused = {};
};

std::vector<Scenario> AllScenarios();

}  // namespace SecPolicyFaults
