// What a child hands to its parent: texts.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace SecPolicyC {

// Of any bytes. Plain, so that the calling process needs no memory to give them up.
using Fields = std::vector<std::string>;

// `fields` as bytes, and back. Nothing for bytes that are not the whole of them.
std::string BytesOf(const Fields& fields);
std::optional<Fields> FieldsOf(std::string_view bytes);

}  // namespace SecPolicyC
