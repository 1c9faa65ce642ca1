// Tardisks, with and without a policy of their own.
#pragma once

#include <map>
#include <string>
#include <vector>

#include "tests/support/host_test.h"

namespace SecPolicyTest {

inline constexpr char kTardiskPolicyDir[] = "/etc/olvane/secpolicy/tardisks";

class TardiskTest : public HostTest {
 protected:
  // A policy file that the tardisk carries.
  void TardiskPolicyFile(const std::string& tardisk, const std::string& file,
                         const std::string& text) {
    Tardisk(tardisk).File(std::string(kTardiskPolicyDir).substr(1) + "/" + file, text);
    tardiskOf_[file] = tardisk;
  }
  [[nodiscard]] static std::string PolicyFilePath(const std::string& file) {
    return std::string(kTardiskPolicyDir) + "/" + file;
  }

  // Tardisks of these names, each with one file, without a policy.
  void PlainTardisks(const std::vector<std::string>& names) {
    for (const std::string& name : names) Tardisk(name).File("opt/" + name, "");
  }
  // A tardisk policy directory in which nothing is.
  void EmptyPolicyDirectory(const std::string& tardisk) {
    Tardisk(tardisk).Directory(std::string(kTardiskPolicyDir).substr(1));
  }

  // The entries of a directory of the host, as it lists them.
  std::vector<std::string> Listing(const std::string& dir) {
    Assemble();
    return StandIn::NamesIn(InRoot(dir));
  }
  // The mounted tardisks in listing order.
  std::vector<std::string> Mounted() {
    std::vector<std::string> paths;
    for (const std::string& name : Listing("/tardisks")) paths.push_back("/tardisks/" + name);
    return paths;
  }
  // Gives a policy file another name, by hand; it stays its tardisk's under both.
  void LinkPolicyFile(const std::string& file, const std::string& name) {
    Assemble();
    std::filesystem::create_hard_link(InRoot(PolicyFilePath(file)), InRoot(PolicyFilePath(name)));
    tardiskOf_[name] = tardiskOf_.at(file);
  }
  // The policy files in listing order, and the tardisk that carries one.
  std::vector<std::string> PolicyFiles() { return Listing(kTardiskPolicyDir); }
  [[nodiscard]] const std::string& TardiskOf(const std::string& file) const {
    return tardiskOf_.at(file);
  }

  // Makes objects and domains as an earlier load would have: the domains have the ids 1 to 3 in the
  // order of their names, and the objects those from 3 on.
  void LoadWellKnown(const std::vector<std::string>& objects) {
    WellKnownDomains();
    std::string text;
    for (const std::string& object : objects) text += object + "\n";
    Policy("objects/all", text);
    RunWithInterface([&](auto& iface) {
      SecPolicy::LoadPolicyObjects(PolicyPath("objects"), iface);
      SecPolicy::LoadPolicyDomains(PolicyPath("domains"), iface);
    });
  }

  // The label that the file carries, or why it cannot be read.
  std::string LabelOf(const std::string& path) {
    const Outcome outcome =
        RunWithInterface([&](auto& iface) { return SecPolicy::GetFileLabel(path, iface); });
    return outcome.error.empty() ? outcome.value : outcome.error;
  }

  // The transitions that the kernel holds for a domain: label, target and target's id, line.
  Outcome Transitions(unsigned int domain) {
    return RunWithInterface([&](auto& iface) {
      std::list<ZekCtl::Security::ZekAccess_DomTransRule> rules;
      iface.GetDomTransRules(domain, rules);
      std::string text;
      for (const auto& rule : rules) {
        text += rule.label + " " + rule.targetDomain + " " + rule.transition + " into " +
                std::to_string(rule.targetDomainId) + " line " + std::to_string(rule.line) +
                (rule.grant ? " grant\n" : " revoke\n");
      }
      return text;
    });
  }

 private:
  std::map<std::string, std::string> tardiskOf_;
};

}  // namespace SecPolicyTest
