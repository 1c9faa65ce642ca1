#include "bindings/c/fields.h"

#include <cstdint>
#include <cstring>

namespace SecPolicyC {

namespace {

// Both are the same process but for a fork: numbers are as they lie in memory.
void Append(std::uint64_t number, std::string& bytes) {
  char place[sizeof number];
  std::memcpy(place, &number, sizeof number);
  bytes.append(place, sizeof place);
}

std::optional<std::uint64_t> TakeNumber(std::string_view& bytes) {
  std::uint64_t number = 0;
  if (bytes.size() < sizeof number) return std::nullopt;
  std::memcpy(&number, bytes.data(), sizeof number);
  bytes.remove_prefix(sizeof number);
  return number;
}

}  // namespace

std::string BytesOf(const Fields& fields) {
  std::string bytes;
  Append(fields.size(), bytes);
  for (const std::string& field : fields) {
    Append(field.size(), bytes);
    bytes += field;
  }
  return bytes;
}

std::optional<Fields> FieldsOf(std::string_view bytes) {
  const auto count = TakeNumber(bytes);
  if (!count) return std::nullopt;
  Fields fields;
  while (fields.size() < *count) {
    const auto size = TakeNumber(bytes);
    if (!size || *size > bytes.size()) return std::nullopt;
    fields.emplace_back(bytes.substr(0, *size));
    bytes.remove_prefix(*size);
  }
  return fields;
}

}  // namespace SecPolicyC
