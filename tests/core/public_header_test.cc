// The signatures that the host's own programs are compiled against: this file compiles or it fails.
#include "secpolicy/secpolicy.h"

#include <type_traits>

namespace SecPolicyTest {
namespace {

using namespace SecPolicy;

using Interface = ZekCtl::Security::ZekAccessInterfaceImpl;
using LabelType = ZekCtl::Security::ZekAccessLabelType;
using FileRule = ZekCtl::Security::ZekAccess_FileRule;
using std::string;
using Labels = std::vector<string>;
using Queue = std::queue<string>;

template <auto function, typename Signature>
inline constexpr bool kIs = std::is_same_v<decltype(function), Signature*>;

// Loading and displaying a whole policy.
static_assert(kIs<LoadPolicy, void(string)>);
static_assert(kIs<DisplayPolicy, void(string)>);
static_assert(kIs<GetGlobalVMDomain, unsigned int()>);
static_assert(kIs<GetIOFilterDomain, unsigned int()>);
static_assert(kIs<GetDefaultTardiskDomain, unsigned int()>);

// Reading policy files.
static_assert(kIs<StringToQueue, Queue(string)>);
static_assert(kIs<ParsePolicyLine, Queue(string)>);
static_assert(kIs<ParseFile, void(string, std::map<unsigned int, Queue>&)>);
static_assert(kIs<GetFileList, void(string, std::map<string, string>&)>);
static_assert(kIs<IsGrant, bool(string&)>);

// Diagnostics.
static_assert(kIs<SecpolicyInfo, void(string)>);
static_assert(kIs<SecpolicyError, void(string)>);
static_assert(kIs<RuleSizeError, void()>);
static_assert(kIs<DisplayHeader, void(string, string)>);
static_assert(kIs<ThrowDomainParseError, void(unsigned int, string, string)>);
static_assert(kIs<ThrowDomainSetError, void(unsigned int, string, string)>);

// Stages.
static_assert(kIs<LoadPolicyObjects, void(string, Interface&)>);
static_assert(kIs<LoadPolicyDomains, void(string, Interface&)>);
static_assert(kIs<LoadPolicyTardisks, void(string, Interface&)>);
static_assert(kIs<LoadPolicyFileLabels, void(string, Interface&)>);
static_assert(kIs<SetDefaultTardiskPolicy, void(std::list<string>&, Interface&)>);

// Displays.
static_assert(kIs<DisplayPolicyDomains, void(Interface&, string)>);
static_assert(kIs<DisplayDomainPolicy, void(Interface&, unsigned int)>);
static_assert(kIs<DisplayPolicyObjects, void(Interface&)>);
static_assert(kIs<DisplayPolicyTardiskLabels, void(Interface&)>);

// Labels.
using NamesToIds = std::map<string, long>;
static_assert(kIs<SyncLabelsFromPolicy, void(Labels, NamesToIds, LabelType, Interface&)>);
static_assert(kIs<GetObsoleteLabels, Labels(Labels, NamesToIds, LabelType, Interface&)>);
static_assert(kIs<PrintObsoleteLabels, void(Labels, LabelType)>);
static_assert(kIs<PrintInvalidLabels, void(Labels, LabelType)>);
static_assert(kIs<SetFileLabel, int(string, string, Interface&)>);
static_assert(kIs<SetDirLabelRecursive, void(string, string, Interface&)>);
static_assert(kIs<GetFileLabel, string(string, Interface&)>);

// Domains and worlds.
static_assert(kIs<CreateDomain, unsigned int(const string&)>);
static_assert(kIs<DestroyDomain, void(unsigned int)>);
static_assert(kIs<AddUlvoService, void(unsigned int, const string&)>);
static_assert(kIs<GetDomainIDForWorld, unsigned int(int)>);
static_assert(kIs<GetDomainNameForID, string(unsigned int)>);
static_assert(kIs<RetrieveLeakedDomains, void(unsigned long, unsigned int*, unsigned int*)>);

// File rules.
static_assert(
    kIs<AddFilePolicyBatch, void(int, unsigned int, FileRule*, unsigned int, unsigned int*)>);
static_assert(kIs<RemoveFilePolicy, void(int, unsigned int, const string&)>);
static_assert(kIs<UpdateFilePolicy, void(unsigned int, const string&, unsigned int)>);
static_assert(kIs<ReplaceFilePolicyVMs, void(const string&, const string&)>);
static_assert(kIs<RetrieveNumberOfFilePolicies, unsigned int(unsigned int)>);
static_assert(kIs<RetrieveFilePolicies, void(unsigned int, FileRule*, unsigned int)>);

// Types that hosts name through this namespace.
static_assert(std::is_same_v<SecPolicy::ZekAccess_FileRule, FileRule>);
static_assert(std::is_same_v<SecPolicy::ZekAccessInterfaceImpl, Interface>);
static_assert(std::is_same_v<SecPolicy::ZekAccessLabelType, LabelType>);
static_assert(sizeof(FileRule) == 1988 && sizeof(FileRule::path) == 1984);

}  // namespace
}  // namespace SecPolicyTest
