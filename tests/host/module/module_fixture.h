// A simulated module in a world of the test's making.
#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <functional>
#include <ostream>
#include <set>
#include <string>
#include <vector>

#include "host/module/description_json.h"
#include "host/module/module_error.h"
#include "host/module/simulated_module.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

// For messages of failed expectations.
inline void PrintTo(const Rule& rule, std::ostream* out) {
  *out << rule.line << ":";
  for (const std::string& word : rule.words) {
    *out << " " << word;
  }
  *out << " (" << rule.targetDomain << ") " << (rule.decision == Decision::kGrant);
}

// Processes that run as the test says; the one that asks is 100 and runs.
class FakeProcessTable : public ProcessTable {
 public:
  ProcessIdentity Self() const override { return self; }
  bool Runs(const ProcessIdentity& process) const override {
    return process.pid > 0 && !ended.contains(process.pid);
  }

  ProcessIdentity self{100, 5000};
  std::set<pid_t> ended;
};

// What an action was refused with: "ERRNO: TEXT", with the errno's name; "(done)" when it was not.
inline std::string RefusalOf(const std::function<void()>& action) {
  try {
    action();
  } catch (const ModuleError& error) {
    return std::string(strerrorname_np(error.Number())) + ": " + error.what();
  }
  return "(done)";
}

inline std::string HostErrorOf(const std::function<void()>& action) {
  try {
    action();
  } catch (const HostError& error) {
    return error.what();
  }
  return "(nothing was thrown)";
}

// A module whose lists are small enough to be seen at a glance:
inline constexpr char kDescription[] = R"({
  "format": 1,
  "limits": {"domains": 5, "labels": 6, "fileRulesPerDomain": 3},
  "enforcementLevel": "permissive",
  "words": {"capabilities": ["net_admin", "sys_boot"], "paramCapabilities": ["net_bind"],
            "objectAccesses": ["read", "write"], "transitionEvents": ["exec"],
            "fileTypes": ["file", "dir"], "socketTypes": ["stream"],
            "systemCalls": ["read", "open", "close"]},
  "labels": {"domain": {"predefined": ["any"]},
             "object": {"predefined": ["default", "tardisk"], "invalid": ["stale", "staler"]}},
  "privilegedVms": ["control"],
  "worlds": [{"id": 4711, "domain": "guestDom"}, {"id": 4712, "domain": "guestDom"},
             {"id": 100, "domain": "guestDom"}]
})";

class ModuleTest : public testing::Test {
 protected:
  static constexpr LabelType kDomain = LabelType::kDomain;
  static constexpr LabelType kObject = LabelType::kObject;

  DomainId Make(const std::string& name) {
    return module_.CreateDomain(name, DomainOrigin::kPolicy);
  }
  DomainId MakeAtRunTime(const std::string& name) {
    return module_.CreateDomain(name, DomainOrigin::kRunTime);
  }
  void Set(RuleType type, DomainId domain, const std::vector<std::string>& words,
           Decision decision = Decision::kGrant, std::uint32_t line = 1) {
    module_.SetRule(type, domain, {line, words, 0, decision});
  }
  void SetTransition(DomainId from, const std::string& label, const std::string& target,
                     std::uint32_t line = 1) {
    const auto id = module_.FindDomain(target);
    module_.SetRule(RuleType::kTransition, from,
                    {line, {label, target, "exec"}, id.value(), Decision::kGrant});
  }
  // The words of each rule, in order, joined by blanks.
  std::vector<std::string> WordsOf(RuleType type, DomainId domain) {
    std::vector<std::string> all;
    for (const Rule& rule : module_.Rules(type, domain)) {
      std::string words;
      for (const std::string& word : rule.words) {
        words += (words.empty() ? "" : " ") + word;
      }
      all.push_back(words);
    }
    return all;
  }
  std::uint32_t AddFileRules(DomainId domain, const std::vector<FileRule>& rules) {
    std::uint32_t taken = 99;
    module_.AddFileRules(domain, rules, taken);
    return taken;
  }
  // "world path permission" of each file rule, in order.
  std::vector<std::string> FileRulesOf(DomainId domain) {
    std::vector<std::string> all;
    for (const FileRule& rule : module_.FileRules(domain)) {
      all.push_back(std::to_string(rule.world) + " " + rule.path + " " +
                    std::to_string(rule.permission));
    }
    return all;
  }

  FakeProcessTable processes_;
  SimulatedModule module_{ReadDescription(kDescription, "host.json"), processes_};
};

}  // namespace StandIn
