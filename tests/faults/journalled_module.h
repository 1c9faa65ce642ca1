// A module that remembers what changed it, so that another can be brought to the same state.
#pragma once

#include <functional>
#include <vector>

#include "host/module/security_module.h"
#include "tests/support/counted_memory.h"

namespace StandIn {

// Hands every operation on to `module`, which must outlive it, and remembers those that changed
// something and succeeded.
class JournalledModule final : public SecurityModule {
 public:
  explicit JournalledModule(SecurityModule& module) : module_(module) {}

  // Does all that was remembered to another module, in the same order.
  void Replay(SecurityModule& module) const;

  std::optional<DomainId> FindDomain(const std::string& name) override;
  DomainId CreateDomain(const std::string& name, DomainOrigin origin) override;
  void DestroyDomain(DomainId domain) override;
  std::string DomainName(DomainId domain) override;
  std::optional<DomainInfo> GetDomainInfo(DomainId domain) override;
  std::uint32_t MaxDomains() override;
  std::vector<DomainId> LeakedDomains() override;
  void SetDomainRole(DomainRole role, DomainId domain) override;
  void AddService(DomainId domain, const std::string& service) override;
  DomainId WorldDomain(WorldId world) override;
  void PlaceWorld(WorldId world, DomainId domain) override;
  void ValidateWord(WordList list, const std::string& word) override;
  std::map<std::string, long> Words(WordList list) override;
  void SetRule(RuleType type, DomainId domain, const Rule& rule) override;
  std::vector<Rule> Rules(RuleType type, DomainId domain) override;
  void CheckCapabilityParams(const std::string& domainName,
                             const std::vector<Rule>& rules) override;
  std::vector<std::string> InvalidLabels(LabelType type) override;
  void AddLabels(const std::vector<std::string>& labels, LabelType type) override;
  void RemoveLabels(const std::vector<std::string>& labels, LabelType type) override;
  bool IsPredefinedLabel(const std::string& label, LabelType type) override;
  bool IsPrivilegedVm(const std::string& name) override;
  LabelId LookupLabel(const std::string& label, LabelType type) override;
  std::string LabelName(LabelId label, LabelType type) override;
  void AddFileRules(DomainId domain, const std::vector<FileRule>& rules,
                    std::uint32_t& taken) override;
  void RemoveFileRule(WorldId world, DomainId domain, const std::string& path) override;
  void UpdateFileRule(DomainId domain, const std::string& path, std::uint32_t permission) override;
  void ReplacePath(const std::string& oldPath, const std::string& newPath) override;
  std::uint32_t CountFileRules(DomainId domain) override;
  std::vector<FileRule> FileRules(DomainId domain) override;
  void SetFileLabel(const std::string& path, LabelId label) override;
  LabelId FileLabel(const std::string& path) override;
  std::string Tardisk(TardiskWord word) override;

 private:
  using Change = std::function<void(SecurityModule&)>;

  // What remembering takes is not the module's.
  template <typename Make>
  void Remember(const Make& make) {
    const SecPolicyTest::OwnMemory ownMemory;
    changes_.push_back(make());
  }

  SecurityModule& module_;
  std::vector<Change> changes_;
};

}  // namespace StandIn
