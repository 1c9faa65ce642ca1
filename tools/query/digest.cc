#include "tools/query/digest.h"

#include <openssl/evp.h>

#include <array>
#include <set>
#include <stdexcept>

namespace SecPolicyTool {

namespace {

using Fields = std::vector<std::string>;
using Records = std::set<std::string>;

std::string RecordOf(const Fields& fields) {
  std::string record;
  for (const std::string& field : fields) {
    record += std::to_string(field.size()) + ":" + field + ",";
  }
  return record + "\n";
}

Fields FieldsOf(const std::string& domain, const PolicyRule& rule) {
  Fields fields{"rule", domain, InfoOf(rule.key.type).keyword};
  fields.insert(fields.end(), rule.key.words.begin(), rule.key.words.end());
  fields.push_back(DecisionOf(rule));
  if (rule.key.world != 0) fields.push_back(std::to_string(rule.key.world));
  return fields;
}

Records RecordsOf(const Policy& policy) {
  Records records;
  for (const auto& [name, domain] : policy.domains) {
    records.insert(RecordOf({"domain", name}));
    for (const PolicyRule& rule : domain.rules) records.insert(RecordOf(FieldsOf(name, rule)));
  }
  for (const auto& [name, object] : policy.objects) {
    if (!object.isPredefined) records.insert(RecordOf({"object", name}));
  }
  for (const auto& [path, file] : policy.files) {
    records.insert(RecordOf({"file", path, file.label}));
  }
  for (const auto& [name, tardisk] : policy.tardisks) {
    records.insert(RecordOf({"tardisk", name, tardisk.label}));
  }
  return records;
}

std::string Sha256(const std::string& text) {
  std::array<unsigned char, EVP_MAX_MD_SIZE> digest{};
  unsigned int size = 0;
  if (EVP_Digest(text.data(), text.size(), digest.data(), &size, EVP_sha256(), nullptr) != 1) {
    throw std::runtime_error("the digest cannot be computed: SHA-256 is not available");
  }
  constexpr char kHex[] = "0123456789abcdef";
  std::string hex;
  for (unsigned int i = 0; i < size; ++i) {
    hex += kHex[digest[i] >> 4];
    hex += kHex[digest[i] & 0xF];
  }
  return hex;
}

}  // namespace

std::string Digest(const Policy& policy) {
  std::string text = RecordOf({"secpolicy-digest", "1"});
  for (const std::string& record : RecordsOf(policy)) text += record;
  return Sha256(text);
}

}  // namespace SecPolicyTool
