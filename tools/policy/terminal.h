// How the command writes to a terminal.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace SecPolicyTool {

// Whether what goes to this descriptor may be coloured: it is a terminal, NO_COLOR is unset or
// empty, and TERM is not "dumb".
bool WantsColour(int descriptor);

enum class Colour : std::uint8_t { kRed, kYellow, kGreen, kCyan, kBold };

// Colours texts, or leaves them as they are.
class Painter {
 public:
  explicit Painter(bool isColoured) : isColoured_(isColoured) {}

  [[nodiscard]] std::string Paint(Colour colour, const std::string& text) const;

 private:
  bool isColoured_;
};

// `text` with control characters, those beyond ASCII too, and bytes that are no UTF-8 written as
// \xNN, so that it cannot change what a terminal shows, and is as wide as its characters are many.
std::string Printable(std::string_view text);

}  // namespace SecPolicyTool
