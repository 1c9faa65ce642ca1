// Permissions of file rules, as they are typed and shown.
#pragma once

#include <cstdint>
#include <string>

namespace SecPolicyTool {

// The bits of letters "r", "w" and "x" in any order, each at most once; none for "-". Throws
// std::invalid_argument `"rq" is no permission: it takes letters of "rwx", each once, or "-" for
// none`.
std::uint32_t ParsePermission(const std::string& letters);

// The letters of the bits, in the order "rwx"; "-" for none.
std::string PermissionText(std::uint32_t permission);

}  // namespace SecPolicyTool
