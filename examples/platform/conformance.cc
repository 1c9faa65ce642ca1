// Checks whether a platform's library does what docs/porting.md asks of it.
//
//   conformance [FILE]    FILE is a file that the platform has labelled; it gets another label, and
//                         its own back. Without it the attribute and Sysinfo are not judged.
//
// To be linked with libsecpolicy for that platform and run on the target, as the user that loads
// policies. It makes a domain and a label of its own and removes them again. A line for each check:
//
//   conforming      OPERATION: WHAT IS ASKED
//   NOT CONFORMING  OPERATION: WHAT IS ASKED: REASON
//   not judged      OPERATION: WHAT IS ASKED: REASON
//
// Exit status 0 when nothing is "NOT CONFORMING", 1 when something is, 2 for a wrong call.
#include <secpolicy/secpolicy.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <exception>
#include <functional>
#include <iostream>
#include <limits>
#include <list>
#include <string>
#include <vector>

#include "platform/sysinfo.h"
#include "platform/zek_access.h"

namespace {

using Tavon::Lib::TavonException;
using namespace ZekCtl::Security;  // NOLINT(google-build-using-namespace): the subject of it all

constexpr unsigned int kUnchanged = 0xabcdef01;

struct NotConforming {
  std::string reason;
};
struct NotJudged {
  std::string reason;
};

void Expect(bool isSo, const std::string& otherwise) {
  if (!isSo) throw NotConforming{otherwise};
}

// `operation` throws a TavonException; its text.
std::string ExpectRefusal(const std::function<void()>& operation, const std::string& otherwise) {
  try {
    operation();
  } catch (const TavonException& refusal) {
    Expect(std::strlen(refusal.what()) > 0, "it refuses without a text");
    return refusal.what();
  }
  throw NotConforming{otherwise};
}

// A domain of its own, for as long as a check runs.
class ScratchDomain {
 public:
  ScratchDomain() try
      : name_("conformance" + std::to_string(getpid())), id_(SecPolicy::CreateDomain(name_)) {
  } catch (const TavonException& refusal) {
    throw NotJudged{std::string("it needs a domain, and none can be made: ") + refusal.what()};
  }
  ~ScratchDomain() {
    try {
      SecPolicy::DestroyDomain(id_);
    } catch (const TavonException& refusal) {
      std::cerr << "The domain " << name_ << " stays: " << refusal.what() << "\n";
    }
  }
  ScratchDomain(const ScratchDomain&) = delete;
  ScratchDomain& operator=(const ScratchDomain&) = delete;

  [[nodiscard]] const std::string& Name() const { return name_; }
  [[nodiscard]] unsigned int Id() const { return id_; }

 private:
  std::string name_;
  unsigned int id_;
};

// An object label of its own, for as long as a check runs.
class ScratchLabel {
 public:
  explicit ScratchLabel(ZekAccessInterfaceImpl& platform) try : platform_(platform) {
    platform_.AddLabels({kName}, kObjectLabel);
  } catch (const TavonException& refusal) {
    throw NotJudged{std::string("it needs a label, and none can be added: ") + refusal.what()};
  }
  ~ScratchLabel() {
    try {
      platform_.RemoveLabels({kName}, kObjectLabel);
    } catch (const TavonException& refusal) {
      std::cerr << "The label " << kName << " stays: " << refusal.what() << "\n";
    }
  }
  ScratchLabel(const ScratchLabel&) = delete;
  ScratchLabel& operator=(const ScratchLabel&) = delete;

  static constexpr const char* kName = "conformanceLabel";

 private:
  ZekAccessInterfaceImpl& platform_;
};

// What a check works with.
struct Subject {
  ZekAccessInterfaceImpl& platform;
  std::string file;  // a labelled file; empty when none was named
};

struct Check {
  std::string operation;
  std::string asked;
  std::function<void(Subject&)> run;
};

// ---- Domains -----------------------------------------------------------------------------------

const std::vector<Check> kDomainChecks{
    {"ZekAccessInterfaceImpl", "two can exist at a time",
     [](Subject&) { const ZekAccessInterfaceImpl second; }},
    {"FindDomain", "an unknown name is not found, and the id stays",
     [](Subject& subject) {
       unsigned int id = kUnchanged;
       Expect(!subject.platform.FindDomain("noSuchDomain", &id), "it found \"noSuchDomain\"");
       Expect(id == kUnchanged, "the id was changed");
     }},
    {"FindDomain", "a domain that has just been made is found",
     [](Subject& subject) {
       const ScratchDomain domain;
       unsigned int id = kUnchanged;
       Expect(subject.platform.FindDomain(domain.Name(), &id), "it was not found");
       Expect(id == domain.Id(),
              "its id is " + std::to_string(domain.Id()) + ", and not " + std::to_string(id));
     }},
    {"GetMaxDomains", "ids are below it",
     [](Subject& subject) {
       const ScratchDomain domain;
       Expect(domain.Id() < subject.platform.GetMaxDomains(),
              "there is a domain with the id " + std::to_string(domain.Id()));
     }},
    {"GetCompleteDomainInfo", "a domain's name",
     [](Subject& subject) {
       const ScratchDomain domain;
       std::string name, level;
       unsigned int state = 0, references = 0, worlds = 0;
       Expect(subject.platform.GetCompleteDomainInfo(domain.Id(), name, level, state, references,
                                                     worlds),
              "it knows no domain with the id " + std::to_string(domain.Id()));
       Expect(name == domain.Name(), "its name is not \"" + name + "\"");
     }},
    {"GetCompleteDomainInfo", "false for an unknown id, and nothing is filled in",
     [](Subject& subject) {
       std::string name = "as it was", level = name;
       unsigned int state = kUnchanged, references = kUnchanged, worlds = kUnchanged;
       Expect(!subject.platform.GetCompleteDomainInfo(std::numeric_limits<unsigned int>::max(),
                                                      name, level, state, references, worlds),
              "it knows a domain with the highest number there is");
       Expect(name == "as it was" && level == "as it was" && state == kUnchanged &&
                  references == kUnchanged && worlds == kUnchanged,
              "something was filled in");
     }},
    {"SetGlobalVMDomain", "the domain globalVMDom is taken",
     [](Subject& subject) {
       unsigned int id = 0;
       if (!subject.platform.FindDomain("globalVMDom", &id)) throw NotJudged{"there is none"};
       subject.platform.SetGlobalVMDomain(id);
     }},
    {"SetIoFilterDomain", "the domain ioFilterDom is taken",
     [](Subject& subject) {
       unsigned int id = 0;
       if (!subject.platform.FindDomain("ioFilterDom", &id)) throw NotJudged{"there is none"};
       subject.platform.SetIoFilterDomain(id);
     }},
    {"AddUlvoService", "a service is allowed",
     [](Subject& subject) {
       const ScratchDomain domain;
       try {
         subject.platform.AddUlvoService(domain.Id(), "conformance");
       } catch (const TavonException& refusal) {
         // Which services there are is the platform's to say.
         throw NotJudged{std::string("\"conformance\" is refused: ") + refusal.what()};
       }
     }},
};

// ---- Words and labels --------------------------------------------------------------------------

void RefusesUnknownWords(Subject& subject) {
  for (unsigned int list = kObjectKeyword; list <= kSyscallKeyword; ++list) {
    const std::string text = ExpectRefusal(
        [&] {
          subject.platform.ValidateKeyword(static_cast<ZekAccess_KeywordType>(list), "noSuchWord");
        },
        "list " + std::to_string(list) + " takes \"noSuchWord\"");
    Expect(text.find("noSuchWord") != std::string::npos,
           "the text does not name the word: " + text);
  }
}

const std::vector<Check> kLabelChecks{
    {"ValidateKeyword", "an unknown word is refused by name in every list", RefusesUnknownWords},
    {"ValidateKeyword", "a label that has been added is a word of the objects",
     [](Subject& subject) {
       const ScratchLabel label(subject.platform);
       subject.platform.ValidateKeyword(kObjectKeyword, ScratchLabel::kName);
     }},
    {"GetKeywordsMap", "the objects have a label that has been added, under its id",
     [](Subject& subject) {
       const ScratchLabel label(subject.platform);
       const auto words = subject.platform.GetKeywordsMap(kObjectKeyword);
       const auto found = words.find(ScratchLabel::kName);
       Expect(found != words.end(), "it is not there");
       Expect(found->second == subject.platform.LookupLabel(ScratchLabel::kName, kObjectLabel),
              "LookupLabel gives another id");
     }},
    {"AddLabels", "an empty list is no error",
     [](Subject& subject) { subject.platform.AddLabels({}, kObjectLabel); }},
    {"AddLabels", "a label that exists keeps its id, also when it is there twice",
     [](Subject& subject) {
       const ScratchLabel label(subject.platform);
       const auto id = subject.platform.LookupLabel(ScratchLabel::kName, kObjectLabel);
       subject.platform.AddLabels({ScratchLabel::kName, ScratchLabel::kName}, kObjectLabel);
       Expect(subject.platform.LookupLabel(ScratchLabel::kName, kObjectLabel) == id,
              "it has another id now");
     }},
    {"RemoveLabels", "an empty list and an unknown label are no errors",
     [](Subject& subject) {
       subject.platform.RemoveLabels({}, kObjectLabel);
       subject.platform.RemoveLabels({"noSuchLabel"}, kObjectLabel);
     }},
    {"RemoveLabels", "a label is gone",
     [](Subject& subject) {
       { const ScratchLabel label(subject.platform); }
       Expect(!subject.platform.GetKeywordsMap(kObjectKeyword).contains(ScratchLabel::kName),
              "it is still there");
     }},
    {"GetInvalidLabels", "a label that has just been added is valid",
     [](Subject& subject) {
       const ScratchLabel label(subject.platform);
       const auto invalid = subject.platform.GetInvalidLabels(kObjectLabel);
       Expect(std::find(invalid.begin(), invalid.end(), ScratchLabel::kName) == invalid.end(),
              "it is listed");
     }},
    {"IsPredefinedLabel", "a label that has been added is not the kernel's own",
     [](Subject& subject) {
       const ScratchLabel label(subject.platform);
       Expect(!subject.platform.IsPredefinedLabel(ScratchLabel::kName, kObjectLabel), "it is");
     }},
    {"IsPrivilegedVm", "an unknown name is that of no privileged virtual machine",
     [](Subject& subject) { Expect(!subject.platform.IsPrivilegedVm("noSuchMachine"), "it is"); }},
    {"LookupLabel", "a label has an id, and an unknown one is refused",
     [](Subject& subject) {
       const ScratchLabel label(subject.platform);
       subject.platform.LookupLabel(ScratchLabel::kName, kObjectLabel);
       ExpectRefusal([&] { subject.platform.LookupLabel("noSuchLabel", kObjectLabel); },
                     "\"noSuchLabel\" has an id");
     }},
    {"GetLabel", "an id gives its label's name, and an unknown one is refused",
     [](Subject& subject) {
       const ScratchLabel label(subject.platform);
       const auto id = subject.platform.LookupLabel(ScratchLabel::kName, kObjectLabel);
       const std::string name = subject.platform.GetLabel(id, kObjectLabel);
       Expect(name == ScratchLabel::kName, "it is \"" + name + "\"");
       ExpectRefusal([&] { subject.platform.GetLabel(kUnchanged, kObjectLabel); },
                     "the id " + std::to_string(kUnchanged) + " has a name");
     }},
    {"setxattr and getxattr", "a labelled file takes another label",
     [](Subject& subject) {
       if (subject.file.empty()) throw NotJudged{"no FILE was named"};
       const ScratchLabel label(subject.platform);
       const std::string before = SecPolicy::GetFileLabel(subject.file, subject.platform);
       SecPolicy::SetFileLabel(subject.file, ScratchLabel::kName, subject.platform);
       const std::string now = SecPolicy::GetFileLabel(subject.file, subject.platform);
       SecPolicy::SetFileLabel(subject.file, before, subject.platform);
       Expect(now == ScratchLabel::kName, "it has the label \"" + now + "\"");
     }},
};

// ---- Rules -------------------------------------------------------------------------------------

// A word of the list.
std::string AWord(Subject& subject, ZekAccess_KeywordType list) {
  const auto words = subject.platform.GetKeywordsMap(list);
  if (words.empty()) throw NotJudged{"GetKeywordsMap has no words for it"};
  return words.begin()->first;
}

// A rule that is set with both decisions is there once, with the later one, behind what the list
// had; `fill` gives it its words.
template <typename Rule>
Check RuleCheck(const std::string& type, void (ZekAccessInterfaceImpl::*set)(Rule),
                void (ZekAccessInterfaceImpl::*get)(unsigned int, std::list<Rule>&),
                const std::function<void(Subject&, Rule&)>& fill) {
  return {"Set" + type + "Rule, Get" + type + "Rules",
          "the later decision wins, and reading appends", [=](Subject& subject) {
            const ScratchDomain domain;
            const ScratchLabel label(subject.platform);
            Rule rule;
            rule.line = 1;
            rule.domainId = domain.Id();
            rule.domainName = domain.Name();
            fill(subject, rule);
            for (const bool isGranted : {true, false}) {
              rule.grant = isGranted;
              (subject.platform.*set)(rule);
            }
            std::list<Rule> rules(1);
            rules.front().line = kUnchanged;
            (subject.platform.*get)(domain.Id(), rules);
            Expect(!rules.empty() && rules.front().line == kUnchanged, "the list was cleared");
            Expect(rules.size() == 2,
                   "it has " + std::to_string(rules.size() - 1) + " rules in place of one");
            Expect(!rules.back().grant, "the earlier decision stays");
          }};
}

std::vector<Check> RuleChecks() {
  using Platform = ZekAccessInterfaceImpl;
  const std::string label = ScratchLabel::kName;
  return {
      RuleCheck<ZekAccess_SyscallRule>(
          "Syscall", &Platform::SetSyscallRule, &Platform::GetSyscallRules,
          [](Subject& subject, auto& rule) { rule.syscall = AWord(subject, kSyscallKeyword); }),
      RuleCheck<ZekAccess_CapabilityRule>("Capability", &Platform::SetCapabilityRule,
                                          &Platform::GetCapabilityRules,
                                          [](Subject& subject, auto& rule) {
                                            rule.capability = AWord(subject, kCapabilityKeyword);
                                          }),
      RuleCheck<ZekAccess_CapabilityParamRule>(
          "CapabilityParam", &Platform::SetCapabilityParamRule, &Platform::GetCapabilityParamRules,
          [](Subject& subject, auto& rule) {
            rule.capability = AWord(subject, kCapabilityParamKeyword);
            rule.parameter = "1";
          }),
      RuleCheck<ZekAccess_ObjectAccessRule>("ObjectAccess", &Platform::SetObjectAccessRule,
                                            &Platform::GetObjectAccessRules,
                                            [label](Subject& subject, auto& rule) {
                                              rule.object = label;
                                              rule.access = AWord(subject, kObjectAccessKeyword);
                                            }),
      RuleCheck<ZekAccess_DomTransRule>("DomTrans", &Platform::SetDomTransRule,
                                        &Platform::GetDomTransRules,
                                        [label](Subject& subject, auto& rule) {
                                          rule.label = label;
                                          rule.targetDomain = rule.domainName;
                                          rule.targetDomainId = rule.domainId;
                                          rule.transition = AWord(subject, kTransitionKeyword);
                                        }),
      RuleCheck<ZekAccess_FileCreationRule>("FileCreation", &Platform::SetFileCreationRule,
                                            &Platform::GetFileCreationRules,
                                            [label](Subject& subject, auto& rule) {
                                              rule.parentLabel = rule.fileLabel = label;
                                              rule.fileType = AWord(subject, kFileTypeKeyword);
                                            }),
      RuleCheck<ZekAccess_UnixSockCreationRule>("UnixSockCreation",
                                                &Platform::SetUnixSockCreationRule,
                                                &Platform::GetUnixSockCreationRules,
                                                [label](Subject& subject, auto& rule) {
                                                  rule.label = label;
                                                  rule.sockType = AWord(subject, kSockTypeKeyword);
                                                }),
      {"CheckCapabilityParamRuleConstraints", "no rules contradict each other",
       [](Subject& subject) {
         subject.platform.CheckCapabilityParamRuleConstraints("conformance", {});
       }},
  };
}

// ---- Tardisks ----------------------------------------------------------------------------------

using ZekCtl::Util::InodeStats;

unsigned long InodeOf(const std::string& file) {
  if (file.empty()) throw NotJudged{"no FILE was named"};
  struct stat status {};
  if (stat(file.c_str(), &status) != 0) throw NotJudged{file + ": " + std::strerror(errno)};
  return status.st_ino;
}

void Ask(unsigned long inode, void* buffer, unsigned int size) {
  ZekCtl::Util::Sysinfo question(ZekCtl::Util::kInodeStatsNode);
  question.AddInstancePath(inode);
  question.Get(buffer, size);
}

InodeStats TardiskOf(unsigned long inode) {
  InodeStats stats{};
  Ask(inode, &stats, sizeof stats);
  return stats;
}

const std::vector<Check> kTardiskChecks{
    {"GetTardiskLaunchDomain", "it has a name",
     [](Subject& subject) {
       Expect(!subject.platform.GetTardiskLaunchDomain().empty(), "it is empty");
     }},
    {"GetTardiskExecEventKeyword", "it is a word of the events",
     [](Subject& subject) {
       subject.platform.ValidateKeyword(kTransitionKeyword,
                                        subject.platform.GetTardiskExecEventKeyword());
     }},
    {"GetDefaultTardiskLabel", "LookupLabel knows it",
     [](Subject& subject) {
       subject.platform.LookupLabel(subject.platform.GetDefaultTardiskLabel(), kObjectLabel);
     }},
    {"GetDefaultTardiskDomain", "it has a name",
     [](Subject& subject) {
       Expect(!subject.platform.GetDefaultTardiskDomain().empty(), "it is empty");
     }},
    {"Sysinfo", "the same answer each time for FILE",
     [](Subject& subject) {
       const unsigned long inode = InodeOf(subject.file);
       const InodeStats first = TardiskOf(inode), second = TardiskOf(inode);
       Expect(std::strncmp(first.tardiskName, second.tardiskName, sizeof first.tardiskName) == 0,
              "it differs");
     }},
    {"Sysinfo", "a reply of the wrong size is refused, and the buffer stays",
     [](Subject& subject) {
       const unsigned long inode = InodeOf(subject.file);
       TardiskOf(inode);
       std::array<char, sizeof(InodeStats)> reply{};
       reply.fill('x');
       ExpectRefusal([&] { Ask(inode, reply.data(), 1); }, "a reply of one byte is given");
       Expect(std::all_of(reply.begin(), reply.end(), [](char each) { return each == 'x'; }),
              "the buffer was changed");
     }},
};

// ---- The private system calls ------------------------------------------------------------------

ZekAccess_FileRule FileRule(const std::string& path, unsigned int permission) {
  ZekAccess_FileRule rule{};
  path.copy(rule.path, sizeof rule.path - 1);
  rule.permission = permission;
  return rule;
}

void AddRule(unsigned int domain, const std::string& path, unsigned int permission) {
  ZekAccess_FileRule rule = FileRule(path, permission);
  unsigned int result = 0;
  SecPolicy::AddFilePolicyBatch(0, domain, &rule, 1, &result);
}

// The only rule of the domain is for `path`, with `permission`.
void ExpectRule(unsigned int domain, const std::string& path, unsigned int permission) {
  const unsigned int count = SecPolicy::RetrieveNumberOfFilePolicies(domain);
  Expect(count == 1, "the domain has " + std::to_string(count) + " rules in place of one");
  ZekAccess_FileRule rule{};
  SecPolicy::RetrieveFilePolicies(domain, &rule, 1);
  Expect(rule.path == path, "the path is \"" + std::string(rule.path) + "\"");
  Expect(rule.permission == permission, "the permission is " + std::to_string(rule.permission));
}

const std::vector<Check> kCallChecks{
    {"16474 and 16475", "a domain is made and destroyed",
     [](Subject& subject) {
       const std::string name = "conformance" + std::to_string(getpid());
       SecPolicy::DestroyDomain(SecPolicy::CreateDomain(name));
       unsigned int id = kUnchanged;
       Expect(!subject.platform.FindDomain(name, &id), "it is still found");
     }},
    {"16487", "a domain's name",
     [](Subject&) {
       const ScratchDomain domain;
       const std::string name = SecPolicy::GetDomainNameForID(domain.Id());
       Expect(name == domain.Name(), "it is \"" + name + "\"");
     }},
    {"16480, 16479 and 16478", "a file rule is added and read",
     [](Subject&) {
       const ScratchDomain domain;
       AddRule(domain.Id(), "/conformance", 0x1);
       ExpectRule(domain.Id(), "/conformance", 0x1);
     }},
    {"16478", "too little room asks the caller to try again",
     [](Subject&) {
       const ScratchDomain domain;
       AddRule(domain.Id(), "/conformance", 0x1);
       try {
         ZekAccess_FileRule none{};
         SecPolicy::RetrieveFilePolicies(domain.Id(), &none, 0);
       } catch (const SecPolicy::SecPolicyRetryException&) {
         return;
       }
       throw NotConforming{"it is no error"};
     }},
    {"16476", "a file rule gets another permission",
     [](Subject&) {
       const ScratchDomain domain;
       AddRule(domain.Id(), "/conformance", 0x1);
       SecPolicy::UpdateFilePolicy(domain.Id(), "/conformance", 0x11);
       ExpectRule(domain.Id(), "/conformance", 0x11);
     }},
    {"16488", "a file rule gets another path",
     [](Subject&) {
       const ScratchDomain domain;
       AddRule(domain.Id(), "/conformance", 0x1);
       SecPolicy::ReplaceFilePolicyVMs("/conformance", "/conformance2");
       ExpectRule(domain.Id(), "/conformance2", 0x1);
     }},
    {"16477", "a file rule is removed",
     [](Subject&) {
       const ScratchDomain domain;
       AddRule(domain.Id(), "/conformance", 0x1);
       SecPolicy::RemoveFilePolicy(0, domain.Id(), "/conformance");
       Expect(SecPolicy::RetrieveNumberOfFilePolicies(domain.Id()) == 0, "it is still there");
     }},
    {"GetFilePathAccessRules", "a file rule is shown with its letters, and reading appends",
     [](Subject& subject) {
       const ScratchDomain domain;
       AddRule(domain.Id(), "/conformance", 0x1);
       std::list<ZekAccess_FilePathAccessRule> rules(1);
       subject.platform.GetFilePathAccessRules(domain.Id(), rules);
       Expect(rules.size() == 2,
              "the list has " + std::to_string(rules.size()) + " entries in place of two");
       Expect(rules.back().path == "/conformance", "the path is \"" + rules.back().path + "\"");
       Expect(rules.back().permissions == "r",
              "the letters are \"" + rules.back().permissions + "\"");
     }},
    {"16486", "this process has a domain",
     [](Subject&) { SecPolicy::GetDomainIDForWorld(getpid()); }},
    {"16485", "a domain with an owner is not leaked",
     [](Subject&) {
       const ScratchDomain domain;
       std::array<unsigned int, 1024> ids{};
       unsigned int count = 0;
       SecPolicy::RetrieveLeakedDomains(ids.size(), ids.data(), &count);
       const auto* const end = ids.data() + std::min<std::size_t>(count, ids.size());
       Expect(std::find(static_cast<const unsigned int*>(ids.data()), end, domain.Id()) == end,
              "it is listed");
     }},
};

// ---- Running them ------------------------------------------------------------------------------

struct Counts {
  unsigned int conforming = 0;
  unsigned int notConforming = 0;
  unsigned int notJudged = 0;
};

void Judge(const Check& check, Subject& subject, Counts& counts) {
  const std::string name = check.operation + ": " + check.asked;
  const auto violation = [&](const std::string& reason) {
    ++counts.notConforming;
    std::cout << "NOT CONFORMING  " << name << ": " << reason << "\n" << std::flush;
  };
  try {
    check.run(subject);
    ++counts.conforming;
    std::cout << "conforming      " << name << "\n" << std::flush;
  } catch (const NotConforming& found) {
    violation(found.reason);
  } catch (const NotJudged& found) {
    ++counts.notJudged;
    std::cout << "not judged      " << name << ": " << found.reason << "\n" << std::flush;
  } catch (const TavonException& refusal) {
    violation(std::string("refused: ") + refusal.what());
  } catch (const std::exception& other) {
    violation(std::string("an exception that is no TavonException: ") + other.what());
  }
}

int Run(const std::string& file) try {
  ZekAccessInterfaceImpl platform;
  Subject subject{platform, file};
  Counts counts;
  for (const auto& checks :
       {kDomainChecks, kLabelChecks, RuleChecks(), kTardiskChecks, kCallChecks}) {
    for (const Check& check : checks) Judge(check, subject, counts);
  }
  std::cout << counts.conforming << " conforming, " << counts.notConforming << " not conforming, "
            << counts.notJudged << " not judged\n";
  return counts.notConforming == 0 ? 0 : 1;
} catch (const TavonException& refusal) {
  std::cout << "NOT CONFORMING  ZekAccessInterfaceImpl: a connection is opened: refused: "
            << refusal.what() << "\n";
  return 1;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc > 2 || (argc == 2 && argv[1][0] == '-')) {
    std::cerr << "usage: " << argv[0] << " [FILE]\n";
    return 2;
  }
  return Run(argc == 2 ? argv[1] : "");
}
