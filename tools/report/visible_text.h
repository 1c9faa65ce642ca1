// Text of any bytes for a page.
#pragma once

#include <cstddef>
#include <string>

namespace SecPolicyTool {

// `text` as valid UTF-8 in which everything can be seen: control characters, bytes that are not
// UTF-8, and characters that have no shape or turn the direction of writing are written as \xNN,
// byte by byte.
std::string VisibleText(const std::string& text);

// How many characters valid UTF-8 has.
std::size_t CharactersIn(const std::string& text);

// The first characters of valid UTF-8 and "…" when it has more than `most`, else `text`.
std::string Shortened(const std::string& text, std::size_t most);

}  // namespace SecPolicyTool
