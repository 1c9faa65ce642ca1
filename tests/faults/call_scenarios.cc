#include <unistd.h>

#include <array>

#include "tests/faults/scenario_parts.h"

namespace SecPolicyFaults {

using SecPolicy::ZekAccess_FileRule;

namespace {

// A call on a kernel that holds the good policy, in which appDom is domain 1.
Scenario Call(const Text& name, std::function<Text()> run, const Text& refused = "",
              Phase first = Phase::kObjectsRead) {
  return {.name = name,
          .prepare = Loaded(HostKind::kGood),
          .run = std::move(run),
          .policyDir = "/policy",
          .first = first,
          .refused = refused};
}

ZekAccess_FileRule FileRule(const char* path) {
  ZekAccess_FileRule rule{};
  Text(path).copy(rule.path, sizeof rule.path - 1);
  rule.permission = 1;
  return rule;
}

Text AddBatch() {
  std::array<ZekAccess_FileRule, 2> rules{FileRule("/srv/x"), FileRule("/srv/y")};
  unsigned int taken = 0;
  SecPolicy::AddFilePolicyBatch(0, kAppDomain, rules.data(), 2, &taken);
  return std::to_string(taken);
}

Text RetrieveRules() {
  std::array<ZekAccess_FileRule, 4> rules{};
  SecPolicy::RetrieveFilePolicies(kAppDomain, rules.data(), rules.size());
  return Text(rules[0].path) + " " + rules[1].path;
}

Text RetrieveLeaked() {
  std::array<unsigned int, 4> ids{};
  unsigned int count = 0;
  SecPolicy::RetrieveLeakedDomains(ids.size(), ids.data(), &count);
  return std::to_string(count);
}

void AddDomainCalls(std::vector<Scenario>& all) {
  all.push_back(Call(
      "create-domain", [] { return std::to_string(SecPolicy::CreateDomain("newDom")); },
      "Failed to create domain:newDom :{reason}"));
  all.push_back(Call("destroy-domain", Doing([] { SecPolicy::DestroyDomain(kAppDomain); }),
                     "Failed to destroy domain:{reason}"));
  all.push_back(Call("add-ulvo-service",
                     Doing([] { SecPolicy::AddUlvoService(kAppDomain, "a-service-of-its-own"); })));
  all.push_back(Call(
      "domain-of-world", [] { return std::to_string(SecPolicy::GetDomainIDForWorld(getpid())); },
      "Unable to get domain ID: {reason}"));
  all.push_back(Call(
      "domain-name", [] { return SecPolicy::GetDomainNameForID(kAppDomain); },
      "Unable to get domain name: {reason}"));
  all.push_back(
      Call("leaked-domains", RetrieveLeaked, "Failed to retrieve leaked domain list:{reason}"));
}

void AddFileRuleCalls(std::vector<Scenario>& all) {
  all.push_back(Call("add-file-policies", AddBatch,
                     "Failed to add file policies to domain :1: world ID :0:{reason}"));
  all.push_back(Call("remove-file-policy",
                     Doing([] { SecPolicy::RemoveFilePolicy(0, kAppDomain, "/etc/app.conf"); }),
                     "Failed to remove file policy from domain :1 : world id :0:{reason}"));
  all.push_back(Call("update-file-policy",
                     Doing([] { SecPolicy::UpdateFilePolicy(kAppDomain, "/etc/app.conf", 1); }),
                     "Failed to update file policy: /etc/app.conf: {reason}"));
  all.push_back(Call("replace-file-policy", Doing([] {
                       SecPolicy::ReplaceFilePolicyVMs("/etc/app.conf", "/etc/new.conf");
                     }),
                     "Failed to replace file policy: /etc/app.conf to: /etc/new.conf: {reason}"));
  all.push_back(Call(
      "count-file-policies",
      [] { return std::to_string(SecPolicy::RetrieveNumberOfFilePolicies(kAppDomain)); },
      "Failed to get number of file policies for domain :: 1:{reason}"));
  all.push_back(Call("retrieve-file-policies", RetrieveRules,
                     "Failed to retrieve policies from domain:: 1 : {reason}"));
}

void AddReaderCalls(std::vector<Scenario>& all) {
  all.push_back(Call("file-list", [] {
    std::map<Text, Text> files;
    SecPolicy::GetFileList("/policy/domains", files);
    return std::to_string(files.size());
  }));
  all.push_back(Call("parse-file", [] {
    std::map<unsigned int, std::queue<Text>> lines;
    SecPolicy::ParseFile("/policy/domains/appDom", lines);
    return std::to_string(lines.size());
  }));
  all.push_back(Call("parse-policy-line", [] {
    return SecPolicy::ParsePolicyLine("-a some-object-with-a-long-name read grant # why").back();
  }));
  all.push_back(Call("string-to-queue", [] {
    return SecPolicy::StringToQueue("a-word-that-is-allocated another-one-of-them").back();
  }));
}

void AddLabelCalls(std::vector<Scenario>& all) {
  all.push_back(Call("set-file-label", WithInterface([](ZekAccessInterfaceImpl& iface) {
                       SecPolicy::SetFileLabel("/bin/tool", "logs", iface);
                     })));
  all.push_back(Call("set-dir-label", WithInterface([](ZekAccessInterfaceImpl& iface) {
                       SecPolicy::SetDirLabelRecursive("/srv/data", "keys", iface);
                     }),
                     "", Phase::kLabelsSet));
  all.push_back(Call("get-file-label", [] {
    ZekAccessInterfaceImpl iface;
    return SecPolicy::GetFileLabel("/bin/tool", iface);
  }));
  all.push_back(Call("sync-labels", WithInterface([](ZekAccessInterfaceImpl& iface) {
                       SecPolicy::SyncLabelsFromPolicy(
                           {"apps", "a-label-that-is-new"}, {{"apps", 3}, {"logs", 4}, {"keys", 5}},
                           SecPolicy::ZekAccessLabelType::kObjectLabel, iface);
                     })));
  all.push_back(Call("obsolete-labels", WithInterface([](ZekAccessInterfaceImpl& iface) {
                       SecPolicy::GetObsoleteLabels(
                           {"apps"}, {{"apps", 3}, {"logs", 4}, {"default", 1}},
                           SecPolicy::ZekAccessLabelType::kObjectLabel, iface);
                     })));
}

// What a call throws when nothing fails.
Text TextOf(const std::function<void()>& call) try {
  call();
  return {};
} catch (const Tavon::Lib::TavonException& failure) {
  return failure.what();
}

void AddDiagnosticCalls(std::vector<Scenario>& all) {
  static constexpr char kMessage[] = "a message that no short string holds";
  all.push_back(Call("info", Doing([] { SecPolicy::SecpolicyInfo(kMessage); })));
  all.push_back(Call("error", Doing([] { SecPolicy::SecpolicyError(kMessage); })));
  all.push_back(Call("header", Doing([] { SecPolicy::DisplayHeader(kMessage, "and another"); })));
  all.push_back(Call("rule-size-error", [] { return TextOf(SecPolicy::RuleSizeError); }));
  all.push_back(Call("domain-parse-error", [] {
    return TextOf([] { SecPolicy::ThrowDomainParseError(7, "appDom", kMessage); });
  }));
  all.push_back(Call("domain-set-error", [] {
    return TextOf([] { SecPolicy::ThrowDomainSetError(7, "appDom", kMessage); });
  }));
  all.push_back(Call("grant-word", [] {
    Text word = "a-word-that-is-no-decision";
    return TextOf([&] { SecPolicy::IsGrant(word); });
  }));
  constexpr auto kType = SecPolicy::ZekAccessLabelType::kObjectLabel;
  all.push_back(Call("print-obsolete-labels", Doing([] {
                       SecPolicy::PrintObsoleteLabels({"apps", "a-label-with-a-long-name"}, kType);
                     })));
  all.push_back(Call("print-invalid-labels", Doing([] {
                       SecPolicy::PrintInvalidLabels({"apps", "a-label-with-a-long-name"}, kType);
                     })));
  all.push_back(Call("well-known-ids", [] {
    return std::to_string(SecPolicy::GetGlobalVMDomain() + SecPolicy::GetIOFilterDomain() +
                          SecPolicy::GetDefaultTardiskDomain());
  }));
}

}  // namespace

void AddCallScenarios(std::vector<Scenario>& all) {
  AddDomainCalls(all);
  AddFileRuleCalls(all);
  AddReaderCalls(all);
  AddLabelCalls(all);
  AddDiagnosticCalls(all);
}

}  // namespace SecPolicyFaults
