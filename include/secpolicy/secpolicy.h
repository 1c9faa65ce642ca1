// libsecpolicy: installs a host's security policy into the kernel's security module.
//
// The library reads a directory of plain-text policy files, checks them, and pushes them into the
// kernel: objects, domains with their rules, tardisk policy and file labels. It prints what the
// kernel holds, and it offers direct calls to the kernel's domains and file rules.
//
// Every function that can fail throws Tavon::Lib::TavonException, whose `what()` is the complete
// text; none returns an error code. Nothing is ever rolled back: what a call had installed before
// it failed stays in the kernel. `reason` in the texts below stands for strerror(errno) after the
// failed call. std::bad_alloc passes through every function. Where the kernel-access library is
// named as a source of exceptions, its texts are the platform's own.
//
// Progress goes to the system log, errors to the system log and standard error, displays to
// standard output. The library starts no threads and locks nothing: call it from one thread at a
// time.
#pragma once

#include <list>
#include <map>
#include <queue>
#include <string>
#include <vector>

#include "platform/tavon_exception.h"
#include "platform/zek_access.h"

#pragma GCC visibility push(default)

namespace SecPolicy {

using ZekCtl::Security::ZekAccessInterfaceImpl;
using ZekCtl::Security::ZekAccessLabelType;

// The caller's array was too small for what the kernel holds: ask for the size again, and repeat
// the call with a larger array.
class SecPolicyRetryException : public Tavon::Lib::TavonException {
 public:
  // Keeps a copy of the text; the structured message is empty.
  explicit SecPolicyRetryException(const std::string& message);
  // Keeps the structured message as well; it is shared, not copied.
  SecPolicyRetryException(const std::string& message,
                          const Tavon::Lib::KestMessage& structuredMessage);
  // Copies the text; the structured message is shared.
  SecPolicyRetryException(const SecPolicyRetryException& other);
  ~SecPolicyRetryException() override;
};

// ---- Loading and displaying a whole policy -------------------------------------------------

// Installs the policy of `dir`, which is used as given, in five steps: objects, domains, the
// well-known domains, tardisks, file labels. A stage that fails is logged and the next one runs;
// "There were some problems encountered in setting the policy" is thrown at the end if any failed.
// Exceptions other than TavonException, and those of looking up the well-known domains, end the
// load at once.
//
// The objects, domains and file labels come from the sub-directories "objects", "domains" and
// "fileLabels" of `dir`; the tardisk policy comes from "/etc/olvane/secpolicy/tardisks", whatever
// `dir` is.
//
// The domains globalVMDom, ioFilterDom and appDom must exist after the domains stage. When one is
// missing, that is logged, and the exception being handled is raised again; as none is, the
// process is terminated through its terminate handler. What was installed until then stays.
void LoadPolicy(std::string dir);

// Prints to standard output what the kernel holds: the domains that `selector` selects (see
// DisplayPolicyDomains), the objects, the tardisks and their labels. Catches nothing.
void DisplayPolicy(std::string selector);

// Kernel id of globalVMDom as the process's last load found it; 0 before. A load that ends before
// it looks the domain up leaves the id as it is.
unsigned int GetGlobalVMDomain();

// The same for ioFilterDom.
unsigned int GetIOFilterDomain();

// The same for appDom.
unsigned int GetDefaultTardiskDomain();

// ---- Reading policy files ------------------------------------------------------------------

// The words of `text`, in order. Only the space separates words; no word is empty.
std::queue<std::string> StringToQueue(std::string text);

// The words of `line` before its first "#".
std::queue<std::string> ParsePolicyLine(std::string line);

// Reads the policy file at `path` and adds to `lines`, by physical line number from 1, the words of
// each line that has any; an entry of the same number is replaced. A line ends at its first NUL
// byte. A line of more than 1023 characters is cut there and is silently the last one read; so is
// the line before a read error. Throws "Unable to open policy file " + path, `lines` unchanged.
void ParseFile(std::string path, std::map<unsigned int, std::queue<std::string>>& lines);

// Adds to `files` the regular files of `dir`, from full path (dir + "/" + name) to name. Entries
// of every other type are skipped, as are those whose type the file system does not report; a
// read error silently ends the listing. Throws "Unable to open policy directory " + dir, `files`
// unchanged.
void GetFileList(std::string dir, std::map<std::string, std::string>& files);

// True for "grant", false for "revoke"; throws "invalid keyword " + word for every other word.
bool IsGrant(std::string& word);

// ---- Diagnostics ---------------------------------------------------------------------------

// Logs to the system log at priority informational.
void SecpolicyInfo(std::string msg);

// Writes "Error: " + msg and a newline to standard error, flushed, and logs the same text to the
// system log at priority error.
void SecpolicyError(std::string msg);

// Throws "incorrect number of arguments for this rule type".
[[noreturn]] void RuleSizeError();

// Prints a banner to standard output: two empty lines, then the two texts between two lines of
// dashes as long as the longer text. Each line is flushed.
void DisplayHeader(std::string first, std::string second);

// Throws "Error in parsing policy for domain: " + domain + ": " + line + " : " + cause. `line` is
// the line in the policy file.
[[noreturn]] void ThrowDomainParseError(unsigned int line, std::string domain, std::string cause);

// Throws "Error in setting policy for domain: " + domain + ": " + line + " : " + cause.
[[noreturn]] void ThrowDomainSetError(unsigned int line, std::string domain, std::string cause);

// ---- Stages --------------------------------------------------------------------------------
//
// Each installs the policy files of one directory through `iface`, which stays the caller's. A
// failing file or item is logged with SecpolicyError and the rest is installed all the same; the
// summary exception follows at the end.

// Makes the kernel's objects those that the files of `dir` name, one on a line: adds them and
// removes all others that are not predefined. Throws GetFileList's text when `dir` cannot be
// listed, nothing changed; "Failure in object policy" when a file was bad or the kernel refused.
void LoadPolicyObjects(std::string dir, ZekAccessInterfaceImpl& iface);

// Creates the domains that the files of `dir` are named after, as far as they are missing, then
// parses, checks and sets every file's rules. Throws GetFileList's text; "Failed to create
// domain: " + name, in which case no rule is set and the domains created before it stay; "Failure
// in domain policy" when any file failed. A domain whose file has a bad line keeps the rules before
// that line; one whose capability parameters contradict each other gets none.
void LoadPolicyDomains(std::string dir, ZekAccessInterfaceImpl& iface);

// Installs the tardisk policy files of `dir`, and the default label and transition for every
// tardisk in /tardisks/ that has none; when `dir` does not exist, the default transition alone.
// Throws "Could not open tardisk dir /tardisks/", "Unable to open policy directory for tardisks " +
// dir, or what finding a policy file's tardisk throws, in which cases nothing is installed; else
// "Failure in setting tardisk policy" when any part failed.
void LoadPolicyTardisks(std::string dir, ZekAccessInterfaceImpl& iface);

// Stores the labels that the files of `dir` give to files and directory trees. Throws
// GetFileList's text; "Failure in file labels policy" when a line was bad or a label could not be
// set. The other labels are set.
void LoadPolicyFileLabels(std::string dir, ZekAccessInterfaceImpl& iface);

// Installs the default transition and labels `tardisks`, paths of the form /tardisks/NAME, with
// the default label. Throws "Failed to fetch domain id for " + launch domain, nothing installed;
// "Failure in setting default tardisk policy" after a logged failure, the rest done. The
// transition's target is the domain that GetDefaultTardiskDomain names.
void SetDefaultTardiskPolicy(std::list<std::string>& tardisks, ZekAccessInterfaceImpl& iface);

// ---- Displays, to standard output ----------------------------------------------------------

// Prints the domain with the decimal id `domain`, read as strtol reads it, or every domain when
// `domain` is empty. For a single domain the kernel-access library's exceptions pass through; for
// all, "Error in displaying the policy for some domains" is thrown after the last.
void DisplayPolicyDomains(ZekAccessInterfaceImpl& iface, std::string domain);

// Prints one domain's state and the rules that the kernel holds for it, in the form of policy
// lines; nothing for an unknown id. Rules that cannot be read are logged and left out.
void DisplayDomainPolicy(ZekAccessInterfaceImpl& iface, unsigned int domainId);

// Prints the objects in the order of their names, each with its kernel id.
void DisplayPolicyObjects(ZekAccessInterfaceImpl& iface);

// Prints each tardisk with its label; one whose label cannot be read is logged instead. Throws
// "Could not open tardisk dir /tardisks/".
void DisplayPolicyTardiskLabels(ZekAccessInterfaceImpl& iface);

// ---- Label synchronisation -----------------------------------------------------------------

// Makes the kernel's labels of `type` those of `policyLabels`. `existing` is what the kernel has,
// from name to id. Invalid labels are removed and added anew; labels that are in `existing` and
// obsolete are removed; then all of `policyLabels` are added. Changes are logged. An exception of
// the kernel-access library passes through and leaves what was done until then.
void SyncLabelsFromPolicy(std::vector<std::string> policyLabels,
                          std::map<std::string, long> existing, ZekAccessLabelType type,
                          ZekAccessInterfaceImpl& iface);

// The labels of `existing`, in the order of their names, that are neither in `policyLabels` nor
// predefined nor, for domain labels, privileged virtual machines.
std::vector<std::string> GetObsoleteLabels(std::vector<std::string> policyLabels,
                                           std::map<std::string, long> existing,
                                           ZekAccessLabelType type, ZekAccessInterfaceImpl& iface);

// Logs the heading of removed labels of this type, and each label on a line of its own; nothing for
// an empty list.
void PrintObsoleteLabels(std::vector<std::string> labels, ZekAccessLabelType type);

// The same under the heading of labels whose values have been changed.
void PrintInvalidLabels(std::vector<std::string> labels, ZekAccessLabelType type);

// ---- File labels ---------------------------------------------------------------------------

// Stores the object label on the file, which must carry a label already; follows links. Returns
// 0. Throws "Unable to set file label (" + label + ") for file " + path + ": " + reason, or the
// kernel-access library's exception for an unknown label; the file keeps its label.
int SetFileLabel(std::string path, std::string label, ZekAccessInterfaceImpl& iface);

// Labels the directory and everything below it, links and sockets excepted, which are neither
// labelled nor followed. Throws at the first failure, SetFileLabel's text or "Unable to open
// directory " + path; what was labelled before keeps the label.
void SetDirLabelRecursive(std::string dir, std::string label, ZekAccessInterfaceImpl& iface);

// The name of the object label that the file carries. Throws "Unable to get file label for file "
// + path + ":" + reason, or the kernel-access library's exception for an id that it does not know.
std::string GetFileLabel(std::string path, ZekAccessInterfaceImpl& iface);

// ---- Kernel calls: domains and worlds ------------------------------------------------------

// Creates an empty domain and returns its id. Throws "Must specify domain name" for an empty one;
// "Failed to create domain:" + name + " :" + reason.
unsigned int CreateDomain(const std::string& name);

// Throws "Failed to destroy domain:" + reason; the domain stays.
void DestroyDomain(unsigned int domainId);

// Allows the domain the named guest communication service. Throws "Must specify service string"
// for an empty one, or the kernel-access library's exception.
void AddUlvoService(unsigned int domainId, const std::string& service);

// The domain in which the world (process) runs. Throws "Unable to get domain ID: " + reason.
unsigned int GetDomainIDForWorld(int worldId);

// The domain's name, at most 127 bytes. Throws "Unable to get domain name: " + reason.
std::string GetDomainNameForID(unsigned int domainId);

// Writes the ids of the domains without owners to `domainIds`, which has room for `capacity` of
// them, and their number to `*count`. Both stay the caller's. When there are more than fit, the
// kernel says what it writes. Throws "Failed to retrieve leaked domain list:" + reason.
void RetrieveLeakedDomains(unsigned long capacity, unsigned int* domainIds, unsigned int* count);

// ---- Kernel calls: file rules --------------------------------------------------------------
//
// Paths are absolute, at most 1983 bytes. Permissions are bits: 0x1 read, 0x2 write, 0x10 execute.
// World id 0 stands for the domain as a whole.

// Adds `count` rules; `*result` is as the kernel sets it. Throws "Failed to add file policies to
// domain :" + domain id + ": world ID :" + world id + ":" + reason; the rules that the kernel took
// before it refused stay.
void AddFilePolicyBatch(int worldId, unsigned int domainId, ZekAccess_FileRule* rules,
                        unsigned int count, unsigned int* result);

// Throws "file path is empty"; "Failed to remove file policy from domain :" + domain id +
// " : world id :" + world id + ":" + reason.
void RemoveFilePolicy(int worldId, unsigned int domainId, const std::string& path);

// Throws "File path is empty"; "Failed to update file policy: " + path + ": " + reason.
void UpdateFilePolicy(unsigned int domainId, const std::string& path, unsigned int permission);

// Renames the path in every rule that names it. Throws "Old path is empty", "New path is empty";
// "Failed to replace file policy: " + old path + " to: " + new path + ": " + reason.
void ReplaceFilePolicyVMs(const std::string& oldPath, const std::string& newPath);

// Throws "Failed to get number of file policies for domain :: " + domain id + ":" + reason.
unsigned int RetrieveNumberOfFilePolicies(unsigned int domainId);

// Fills `rules`, which has room for `capacity` records, with the domain's rules. Throws "Failed to
// retrieve policies from domain:: " + domain id + " : " + reason: a SecPolicyRetryException when
// the room is too small (ask for the number again and repeat), else a TavonException.
void RetrieveFilePolicies(unsigned int domainId, ZekAccess_FileRule* rules, unsigned int capacity);

}  // namespace SecPolicy

#pragma GCC visibility pop
