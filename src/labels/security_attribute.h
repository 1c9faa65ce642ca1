// The door to the attribute in which a file's label is stored.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace SecPolicy {

// Both follow links and leave the reason of a failure in errno.

// Replaces the label id that the file carries; a file that carries none fails with ENODATA. Returns
// setxattr's result, negative for a failure.
[[nodiscard]] int ReplaceLabelId(const std::string& path, std::uint32_t id);

// The label id that the file carries; nothing for a failure.
[[nodiscard]] std::optional<std::uint32_t> ReadLabelId(const std::string& path);

}  // namespace SecPolicy
