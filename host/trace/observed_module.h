// The module behind the point that every operation passes.
#pragma once

#include "host/module/security_module.h"
#include "host/trace/operation_point.h"

namespace StandIn {

// Hands every operation on to `module` through `point`, so that it is traced, kept and, on demand,
// refused in one place, whichever module it is. Both must outlive this object.
class ObservedModule final : public SecurityModule {
 public:
  ObservedModule(SecurityModule& module, const OperationPoint& point)
      : module_(module), point_(point) {}

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
  SecurityModule& module_;
  const OperationPoint& point_;
};

}  // namespace StandIn
