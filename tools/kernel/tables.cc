#include "tools/kernel/tables.h"

#include <charconv>
#include <nlohmann/json.hpp>
#include <optional>
#include <stdexcept>

#include "tools/policy/unknown_word.h"

namespace SecPolicyTool {

using SecPolicy::ZekAccess_FileRule;
using SecPolicy::ZekAccessInterfaceImpl;

namespace {

// Rules may have been removed in between, too: the records behind the last stay empty.
void DropEmptyRecords(std::vector<ZekAccess_FileRule>& rules) {
  while (!rules.empty() && rules.back().path[0] == '\0') rules.pop_back();
}

std::optional<unsigned int> Number(const std::string& text) {
  unsigned int number = 0;
  const char* const end = text.data() + text.size();
  const auto [rest, error] = std::from_chars(text.data(), end, number);
  return error == std::errc() && rest == end ? std::optional(number) : std::nullopt;
}

std::string UnknownDomain(const std::string& name, ZekAccessInterfaceImpl& iface) {
  std::vector<std::string> names;
  for (const DomainRow& row : ReadDomains(iface)) names.push_back(row.name);
  return UnknownWordText("domain", name, names);
}

}  // namespace

std::vector<ZekAccess_FileRule> ReadFileRules(unsigned int domain) {
  for (;;) {
    const unsigned int count = SecPolicy::RetrieveNumberOfFilePolicies(domain);
    std::vector<ZekAccess_FileRule> rules(count);
    try {
      SecPolicy::RetrieveFilePolicies(domain, rules.data(), count);
    } catch (const SecPolicy::SecPolicyRetryException&) {
      continue;
    }
    DropEmptyRecords(rules);
    return rules;
  }
}

std::vector<unsigned int> ReadLeakedDomains() {
  constexpr std::size_t kFirstRoom = 64;
  std::vector<unsigned int> domains(kFirstRoom);
  for (;;) {
    unsigned int count = 0;
    SecPolicy::RetrieveLeakedDomains(domains.size(), domains.data(), &count);
    const bool isComplete = count <= domains.size();
    domains.resize(count);
    if (isComplete) return domains;
  }
}

std::vector<DomainRow> ReadDomains(ZekAccessInterfaceImpl& iface) {
  std::vector<DomainRow> rows;
  const unsigned int slots = iface.GetMaxDomains();
  for (unsigned int id = 0; id < slots; ++id) {
    DomainRow row;
    row.id = id;
    if (iface.GetCompleteDomainInfo(id, row.name, row.enforcementLevel, row.state, row.refCount,
                                    row.worldRefCount)) {
      rows.push_back(row);
    }
  }
  return rows;
}

nlohmann::json ToJson(const DomainRow& row) {
  return {
      {"id", row.id},       {"name", row.name},         {"enforcementLevel", row.enforcementLevel},
      {"state", row.state}, {"refCount", row.refCount}, {"worldRefCount", row.worldRefCount}};
}

unsigned int DomainOf(const std::string& name, ZekAccessInterfaceImpl& iface) {
  unsigned int id = 0;
  if (iface.FindDomain(name, &id)) return id;
  if (const auto number = Number(name)) return *number;
  throw std::runtime_error(UnknownDomain(name, iface));
}

}  // namespace SecPolicyTool
