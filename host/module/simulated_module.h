// The security module, simulated: it decides and remembers as a kernel would, and enforces nothing.
#pragma once

#include <array>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "host/module/module_state.h"
#include "host/module/storable_module.h"
#include "host/module/word_lists.h"

namespace StandIn {

// Beside what SecurityModule says: slot 0 holds the predefined domain `rootDom`. A number that is
// no label type, word list or type of rule is refused with EINVAL. When memory runs out, a list
// that was to be added, removed or renamed is done in part; every other operation is not done at
// all.
class SimulatedModule final : public StorableModule {
 public:
  // As StartModule.
  SimulatedModule(ModuleDescription description, const ProcessTable& processes);

  void Save(const TextSink& sink) const override;
  void Restore(const TextReader& text, const std::string& file) override;
  // The same with whole texts.
  [[nodiscard]] std::string Save() const;
  void Restore(const std::string& text, const std::string& file);

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
  using NumberedWords = std::unordered_map<std::string, long>;

  [[nodiscard]] WorldId Self() const;
  [[nodiscard]] std::uint32_t WorldsIn(DomainId domain) const;
  [[nodiscard]] LabelTable& Labels(LabelType type) const;
  // That of kObjects, which is kept elsewhere, is empty.
  [[nodiscard]] const NumberedWords& WordsOf(WordList list) const {
    return words_[static_cast<std::size_t>(list)];
  }
  void CheckFileRule(DomainId domain, const FileRule& rule) const;

  const ModuleDescription description_;
  const ProcessTable& processes_;
  std::array<NumberedWords, kWordLists.size() + 1> words_;  // by WordList, which counts from 1
  std::unique_ptr<ModuleState> state_;                      // never null
};

}  // namespace StandIn
