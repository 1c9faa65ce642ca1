#include "kernel/domain_calls.h"

#include <array>

#include "core/diagnostics.h"
#include "kernel/private_call.h"
#include "platform/tavon_strcat.h"

namespace SecPolicy {

using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;
using ZekCtl::Kernel::DomainOrigin;
using ZekCtl::Kernel::PrivateCall;

bool CreateKernelDomain(const std::string& name, DomainOrigin origin, unsigned int* id) {
  return IssuePrivateCall(PrivateCall::kCreateDomain, name.c_str(),
                          static_cast<unsigned int>(origin), id) == 0;
}

unsigned int CreateDomain(const std::string& name) {
  const ZekAccessInterfaceImpl iface;
  if (name.empty()) throw TavonException("Must specify domain name");
  unsigned int id = 0;
  if (!CreateKernelDomain(name, DomainOrigin::kRunTime, &id)) {
    throw TavonException(StrCat("Failed to create domain:", name, " :", SystemReason()));
  }
  return id;
}

void DestroyDomain(unsigned int domainId) {
  const ZekAccessInterfaceImpl iface;
  if (IssuePrivateCall(PrivateCall::kDestroyDomain, domainId) != 0) {
    throw TavonException(StrCat("Failed to destroy domain:", SystemReason()));
  }
}

void AddUlvoService(unsigned int domainId, const std::string& service) {
  ZekAccessInterfaceImpl iface;
  if (service.empty()) throw TavonException("Must specify service string");
  iface.AddUlvoService(domainId, service);
}

unsigned int GetDomainIDForWorld(int worldId) {
  unsigned int id = 0;
  if (IssuePrivateCall(PrivateCall::kWorldDomain, worldId, &id) != 0) {
    throw TavonException(StrCat("Unable to get domain ID: ", SystemReason()));
  }
  return id;
}

std::string GetDomainNameForID(unsigned int domainId) {
  std::array<char, ZekCtl::Kernel::kDomainNameBytes> name{};
  if (IssuePrivateCall(PrivateCall::kDomainName, domainId, name.data(), name.size()) != 0) {
    throw TavonException(StrCat("Unable to get domain name: ", SystemReason()));
  }
  name.back() = '\0';
  return name.data();
}

void RetrieveLeakedDomains(unsigned long capacity, unsigned int* domainIds, unsigned int* count) {
  if (IssuePrivateCall(PrivateCall::kLeakedDomains, count, domainIds, capacity) != 0) {
    throw TavonException(StrCat("Failed to retrieve leaked domain list:", SystemReason()));
  }
}

}  // namespace SecPolicy
