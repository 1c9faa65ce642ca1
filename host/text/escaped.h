// Bytes from outside as text that a terminal only shows.
#pragma once

#include <string>
#include <string_view>
#include <utility>

namespace StandIn {

// Text in which nothing changes what a terminal shows or in which order it shows it. Made from any
// bytes by escaping, and in no other way: controls (C0, DEL, C1, line ends and tabs too),
// characters that set the direction of text, characters that cannot be seen (zero-width and the
// like), and bytes that are not UTF-8 are written as \xNN, byte by byte. All else is as it was.
class Escaped {
 public:
  explicit Escaped(std::string_view bytes);

  [[nodiscard]] const std::string& Text() const& { return text_; }
  [[nodiscard]] std::string Text() && { return std::move(text_); }

 private:
  std::string text_;
};

// Appends `byte` to `text` as \xNN.
void AppendEscaped(std::string& text, char byte);

}  // namespace StandIn
