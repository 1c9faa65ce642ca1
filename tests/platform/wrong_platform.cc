// Operations that do what no platform may. Linked into a program, they take the place of those of
// the platform's library.
#include <stdexcept>

#include "platform/tavon_exception.h"
#include "platform/zek_access.h"

namespace ZekCtl::Security {

// Finds nothing, and changes the id all the same.
bool ZekAccessInterfaceImpl::FindDomain(std::string, unsigned int* id) {
  *id = 0;
  return false;
}

// Too few.
unsigned int ZekAccessInterfaceImpl::GetMaxDomains() { return 0; }

// Fills in something for a domain that there is not.
bool ZekAccessInterfaceImpl::GetCompleteDomainInfo(unsigned int, std::string& name, std::string&,
                                                   unsigned int&, unsigned int&, unsigned int&) {
  name = "nobody";
  return false;
}

// Does not name the word.
void ZekAccessInterfaceImpl::ValidateKeyword(ZekAccess_KeywordType, std::string word) {
  if (word == "noSuchWord") throw Tavon::Lib::TavonException("unknown word");
}

// Clears the list.
void ZekAccessInterfaceImpl::GetSyscallRules(unsigned int,
                                             std::list<ZekAccess_SyscallRule>& rules) {
  rules.clear();
}

// Keeps the first decision, and twice.
void ZekAccessInterfaceImpl::GetCapabilityRules(unsigned int,
                                                std::list<ZekAccess_CapabilityRule>& rules) {
  rules.resize(rules.size() + 2);
}

bool ZekAccessInterfaceImpl::IsPrivilegedVm(const std::string&) { return true; }

std::string ZekAccessInterfaceImpl::GetLabel(unsigned int, ZekAccessLabelType) { return "any"; }

// An exception of another kind.
std::string ZekAccessInterfaceImpl::GetDefaultTardiskDomain() { throw std::logic_error("no word"); }

}  // namespace ZekCtl::Security
