// Tables of the kernel that may grow while they are read.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>
#include <vector>

#include "secpolicy/secpolicy.h"

namespace SecPolicyTool {

// The file rules of a domain. Asks for their number, makes room and reads; when rules were added in
// between, all of it again, as often as it takes. Throws what RetrieveNumberOfFilePolicies and
// RetrieveFilePolicies throw, but for SecPolicyRetryException.
std::vector<SecPolicy::ZekAccess_FileRule> ReadFileRules(unsigned int domain);

// The ids of the domains that the kernel calls leaked. Makes more room and asks again when there
// are more than fit. Throws what RetrieveLeakedDomains throws.
std::vector<unsigned int> ReadLeakedDomains();

// What the kernel says about a domain.
struct DomainRow {
  unsigned int id = 0;
  std::string name;
  std::string enforcementLevel;
  unsigned int state = 0;
  unsigned int refCount = 0;
  unsigned int worldRefCount = 0;
};

// An object with a member of each name.
nlohmann::json ToJson(const DomainRow& row);

// All domains, by ascending id. Throws what the kernel-access library throws.
std::vector<DomainRow> ReadDomains(SecPolicy::ZekAccessInterfaceImpl& iface);

// The id of the domain that `name` names: one of that name, else, when it is a number, that one.
// Throws std::runtime_error `unknown domain "NAME"`, as UnknownWordText.
unsigned int DomainOf(const std::string& name, SecPolicy::ZekAccessInterfaceImpl& iface);

}  // namespace SecPolicyTool
