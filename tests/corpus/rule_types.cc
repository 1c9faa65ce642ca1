#include "tests/corpus/rule_types.h"

#include <stdexcept>

namespace SecPolicyTest {

namespace {

CorpusPlace Listed(const std::string& title) { return {Judge::kTable, TableOf(title)}; }
CorpusPlace Free() {
  return {Judge::kNobody,
          {"", {"443", "*", "grant", "-s", "\"8*0", "a\tb", "\xff\xfe", "/etc/x", "revoke\r"}}};
}
CorpusPlace Target() { return {Judge::kDomains, {"", kCorpusDomains}}; }

}  // namespace

CorpusRuleType TypeOf(const std::string& keyword) {
  const std::vector<CorpusRuleType> types{
      {"-s", {Listed("system call")}},
      {"-c", {Listed("capability")}},
      {"-p", {Listed("capability with parameter"), Free()}},
      {"-a", {Listed("object label"), Listed("object access")}},
      {"-d", {Listed("object label"), Target(), Listed("transition event")}},
      {"-f", {Listed("object label"), Listed("object label"), Listed("file type")}},
      {"-u", {Listed("object label"), Listed("socket type")}},
  };
  for (const CorpusRuleType& type : types) {
    if (type.keyword == keyword) return type;
  }
  throw std::invalid_argument("no rule type " + keyword);
}

}  // namespace SecPolicyTest
