// The accesses to files, and the letters of path rules that cover them.
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

namespace StandIn {

// What the engine asks of its own accord; the words of "-a" and "-d" rules.
inline constexpr char kCreateAccess[] = "create";
inline constexpr char kConnectAccess[] = "connect";
inline constexpr char kExecAccess[] = "exec";
inline constexpr char kExecTransition[] = "exec";
inline constexpr char kForkTransition[] = "fork";

// The bit of kPermissionBits that allows the access: r covers read and getattr; w covers write,
// append, create, delete, rename and setattr; x covers exec. Nothing for an access on which path
// rules do not decide, such as "connect".
std::optional<std::uint32_t> PermissionFor(std::string_view access);

}  // namespace StandIn
