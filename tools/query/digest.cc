#include "tools/query/digest.h"

#include <openssl/evp.h>

#include <algorithm>
#include <array>
#include <functional>
#include <initializer_list>
#include <map>
#include <memory>
#include <stdexcept>
#include <string_view>
#include <vector>

namespace SecPolicyTool {

namespace {

using Records = std::vector<std::string>;

void AddField(std::string_view field, std::string& record) {
  record += std::to_string(field.size());
  record += ':';
  record += field;
  record += ',';
}

std::string FieldsOf(std::initializer_list<std::string_view> fields) {
  std::string record;
  for (const std::string_view field : fields) AddField(field, record);
  return record;
}

// The records of some rules or names; each begins with the fields that its group is kept by.
using Group = std::function<Records()>;
// Since no group's fields begin with those of another, their order is that of all records: so there
// is one group at a time in memory.
using Groups = std::map<std::string, Group>;

std::string RecordOf(const std::string& fields, const PolicyRule& rule) {
  std::string record = fields;
  AddField(InfoOf(rule.key.type).keyword, record);
  for (const std::string& word : rule.key.words) AddField(word, record);
  AddField(DecisionOf(rule), record);
  if (rule.key.world != 0) AddField(std::to_string(rule.key.world), record);
  return record + "\n";
}

Group RulesOf(const std::string& fields, const DomainContent& domain) {
  return [fields, &domain] {
    Records records;
    records.reserve(domain.rules.size());
    for (const PolicyRule& rule : domain.rules) records.push_back(RecordOf(fields, rule));
    return records;
  };
}

// A record for each entry of `map`, unless `content` gives nothing for it.
template <typename Map, typename Content>
void AddNames(const char* kind, const Map& map, const Content& content, Groups& groups) {
  groups[FieldsOf({kind})] = [kind, &map, content] {
    Records records;
    for (const auto& [name, value] : map) {
      if (const std::optional<std::string> rest = content(value)) {
        records.push_back(FieldsOf({kind, name}) + *rest + "\n");
      }
    }
    return records;
  };
}

Groups GroupsOf(const Policy& policy) {
  Groups groups;
  const auto nothing = [](const DomainContent&) { return std::optional<std::string>(""); };
  const auto label = [](const LabelledFile& file) {
    return std::optional<std::string>(FieldsOf({file.label}));
  };
  const auto unlessPredefined = [](const ObjectContent& object) {
    return object.isPredefined ? std::nullopt : std::optional<std::string>("");
  };
  for (const auto& [name, domain] : policy.domains) {
    const std::string fields = FieldsOf({"rule", name});
    groups[fields] = RulesOf(fields, domain);
  }
  AddNames("domain", policy.domains, nothing, groups);
  AddNames("object", policy.objects, unlessPredefined, groups);
  AddNames("file", policy.files, label, groups);
  AddNames("tardisk", policy.tardisks, label, groups);
  return groups;
}

// The SHA-256 of texts, one after the other.
class Sha256 {
 public:
  Sha256() : context_(EVP_MD_CTX_new()) {
    Require(context_ != nullptr && EVP_DigestInit_ex(context_.get(), EVP_sha256(), nullptr) == 1);
  }
  void Add(const std::string& text) {
    Require(EVP_DigestUpdate(context_.get(), text.data(), text.size()) == 1);
  }
  std::string Hex() {
    std::array<unsigned char, EVP_MAX_MD_SIZE> digest{};
    unsigned int size = 0;
    Require(EVP_DigestFinal_ex(context_.get(), digest.data(), &size) == 1);
    constexpr char kHex[] = "0123456789abcdef";
    std::string hex;
    for (unsigned int i = 0; i < size; ++i) {
      hex += kHex[digest[i] >> 4];
      hex += kHex[digest[i] & 0xF];
    }
    return hex;
  }

 private:
  struct Free {
    void operator()(EVP_MD_CTX* context) const { EVP_MD_CTX_free(context); }
  };

  static void Require(bool isDone) {
    if (isDone) return;
    throw std::runtime_error("the digest cannot be computed: SHA-256 is not available");
  }

  std::unique_ptr<EVP_MD_CTX, Free> context_;
};

}  // namespace

std::string Digest(const Policy& policy) {
  Sha256 sum;
  sum.Add(FieldsOf({"secpolicy-digest", "1"}) + "\n");
  for (const auto& [fields, group] : GroupsOf(policy)) {
    Records records = group();
    std::sort(records.begin(), records.end());
    records.erase(std::unique(records.begin(), records.end()), records.end());
    for (const std::string& record : records) sum.Add(record);
  }
  return sum.Hex();
}

}  // namespace SecPolicyTool
