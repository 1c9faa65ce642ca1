// What callers hand in.
#pragma once

#include <optional>
#include <string>
#include <vector>

namespace SecPolicyC {

// Each throws Failure, SECPOLICY_INVALID_ARGUMENT, with the name of the argument.

// "NAME is NULL".
void RequireSet(const void* argument, const char* name);

// "NAME is NULL", "NAME is not UTF-8".
std::string TextOf(const char* argument, const char* name);

// Nothing for NULL.
std::optional<std::string> OptionalTextOf(const char* argument, const char* name);

// The path of a directory, and no empty one: "NAME is empty".
std::string PathOf(const char* argument, const char* name);

// Of a policy: empty, which means the host's own one, for NULL alone.
std::string PolicyDirOf(const char* argument, const char* name);

// Of a question. Without any: SECPOLICY_BAD_REQUEST "a question without words".
std::vector<std::string> WordsOf(const char* const* words, std::size_t count);

}  // namespace SecPolicyC
