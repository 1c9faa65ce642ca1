// The kernel's security module, as everything above it sees it.
#pragma once

#include <cstdint>
#include <list>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "host/module/rule.h"
#include "platform/private_calls.h"

namespace StandIn {

using ZekCtl::Kernel::DomainOrigin;

// Label spaces and word lists, with the numbers that the access library gives them.
enum class LabelType : unsigned int { kDomain = 0, kObject = 1 };
enum class WordList : unsigned int {
  kObjects = 1,  // the object labels defined now
  kCapabilities = 2,
  kParamCapabilities = 3,
  kObjectAccesses = 4,
  kTransitionEvents = 5,
  kFileTypes = 6,
  kSocketTypes = 7,
  kSyscalls = 8,
};
constexpr LabelType ToModule(ZekCtl::Security::ZekAccessLabelType type) {
  return static_cast<LabelType>(type);
}
constexpr WordList ToModule(ZekCtl::Security::ZekAccess_KeywordType list) {
  return static_cast<WordList>(list);
}

enum class DomainRole : std::uint8_t { kGlobalVM, kIoFilter };

// What the module answers about tardisks.
enum class TardiskWord : std::uint8_t { kLaunchDomain, kExecEvent, kDefaultLabel, kDefaultDomain };

struct DomainInfo {
  std::string name;
  std::string enforcementLevel;
  std::uint32_t state = 0;          // 1: the slot holds a live domain
  std::uint32_t refCount = 0;       // worlds in the domain and transitions into it
  std::uint32_t worldRefCount = 0;  // worlds in the domain
};

// Everything that the module can be asked. One implementation simulates it; others may enforce it.
// Nothing outside host/module/ depends on how an implementation keeps its state.
//
// Every operation may throw ModuleError. What an operation had done before it threw stays done.
class SecurityModule {
 public:
  virtual ~SecurityModule() = default;

  // ---- Domains ----
  // Nothing when no domain has that name.
  virtual std::optional<DomainId> FindDomain(const std::string& name) = 0;
  // Takes the lowest free slot. EINVAL (empty name, or a NUL in it), ENAMETOOLONG (over 127 bytes),
  // EEXIST, ENOSPC.
  virtual DomainId CreateDomain(const std::string& name, DomainOrigin origin) = 0;
  // Frees the slot with its rules, and drops the transitions of other domains into it. ENOENT,
  // EBUSY (predefined, or worlds run in it).
  virtual void DestroyDomain(DomainId domain) = 0;
  // ENOENT when the slot is free.
  virtual std::string DomainName(DomainId domain) = 0;
  // Nothing when the slot is free.
  virtual std::optional<DomainInfo> GetDomainInfo(DomainId domain) = 0;
  virtual std::uint32_t MaxDomains() = 0;
  // Ids, ascending, of the domains made at run time in which no world runs and whose maker ended.
  virtual std::vector<DomainId> LeakedDomains() = 0;
  // ENOENT when the slot is free.
  virtual void SetDomainRole(DomainRole role, DomainId domain) = 0;
  // ENOENT; EINVAL when the service is empty. Adding a service twice changes nothing.
  virtual void AddService(DomainId domain, const std::string& service) = 0;

  // ---- Worlds ----
  // ESRCH when no such world is known.
  virtual DomainId WorldDomain(WorldId world) = 0;
  // Puts a world, known or new, into a domain. ENOENT; EINVAL when the world id is not positive.
  virtual void PlaceWorld(WorldId world, DomainId domain) = 0;

  // ---- Words ----
  // EINVAL with a text that names the word, its list and the nearest accepted word.
  virtual void ValidateWord(WordList list, const std::string& word) = 0;
  // Words and ids; for kObjects the object labels and theirs.
  virtual std::map<std::string, long> Words(WordList list) = 0;

  // ---- Rules ----
  // One decision per domain, type and words: a later one replaces an earlier one in its place.
  // ENOENT (the domain, or a transition's target), EINVAL (a word that its list rejects, an empty
  // parameter or target's name, or a wrong number of words).
  virtual void SetRule(RuleType type, DomainId domain, const Rule& rule) = 0;
  // In the order in which their words were first set. ENOENT.
  virtual std::vector<Rule> Rules(RuleType type, DomainId domain) = 0;
  // EINVAL naming both lines when one capability and parameter is granted and revoked in `rules`.
  virtual void CheckCapabilityParams(const std::string& domainName,
                                     const std::vector<Rule>& rules) = 0;

  // ---- Labels ----
  virtual std::vector<std::string> InvalidLabels(LabelType type) = 0;
  // Ids ascend from 1 and are never given again; an existing label keeps its id. EINVAL (empty
  // name, or a NUL in it), ENAMETOOLONG (over 127 bytes), ENOSPC.
  virtual void AddLabels(const std::vector<std::string>& labels, LabelType type) = 0;
  // An unknown label is passed over. EPERM for a predefined one.
  virtual void RemoveLabels(const std::vector<std::string>& labels, LabelType type) = 0;
  virtual bool IsPredefinedLabel(const std::string& label, LabelType type) = 0;
  virtual bool IsPrivilegedVm(const std::string& name) = 0;
  // ENOENT for an unknown one.
  virtual LabelId LookupLabel(const std::string& label, LabelType type) = 0;
  virtual std::string LabelName(LabelId label, LabelType type) = 0;

  // ---- File rules ----
  // Keyed by world and path; an existing path's permission is replaced. `taken` counts the records
  // taken and is right also after a refusal half-way. ENOENT (domain), ESRCH (world), EINVAL (a
  // world of another domain, a path that is not absolute, unknown permission bits), ENAMETOOLONG,
  // ENOSPC (the domain's table is full).
  virtual void AddFileRules(DomainId domain, const std::vector<FileRule>& rules,
                            std::uint32_t& taken) = 0;
  // ENOENT when the domain or the rule is unknown.
  virtual void RemoveFileRule(WorldId world, DomainId domain, const std::string& path) = 0;
  // For every world's rule of that path. ENOENT; EINVAL for unknown permission bits.
  virtual void UpdateFileRule(DomainId domain, const std::string& path,
                              std::uint32_t permission) = 0;
  // Renames the path in every rule of every domain; a rule that has the new path already is
  // replaced. ENOENT when no rule names the old path; EINVAL, ENAMETOOLONG for the new one.
  virtual void ReplacePath(const std::string& oldPath, const std::string& newPath) = 0;
  virtual std::uint32_t CountFileRules(DomainId domain) = 0;
  // All of the domain's, in the order in which they were first set. ENOENT.
  virtual std::vector<FileRule> FileRules(DomainId domain) = 0;

  // ---- File labels ----
  // Labels of the files of the root image, by path within it. A file that was never labelled
  // carries the label `default`; one whose label was removed keeps its id. EINVAL when no object
  // label has the id.
  virtual void SetFileLabel(const std::string& path, LabelId label) = 0;
  virtual LabelId FileLabel(const std::string& path) = 0;

  // ---- Tardisks ----
  virtual std::string Tardisk(TardiskWord word) = 0;
};

}  // namespace StandIn
