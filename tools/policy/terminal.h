// How the command writes to a terminal.
#pragma once

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <string>
#include <string_view>
#include <utility>

namespace SecPolicyTool {

// Whether what goes to this descriptor may be coloured: it is a terminal, NO_COLOR is unset or
// empty, and TERM is not "dumb".
bool WantsColour(int descriptor);

enum class Colour : std::uint8_t { kRed, kYellow, kGreen, kCyan, kBold };

// Text of this program that a terminal may be sent: escaped bytes, and between them line ends and
// colours. Every string that becomes a part of it is escaped on the way (see StandIn::Escaped),
// whoever it comes from; the members below are the only source of control characters.
class TerminalText {
 public:
  TerminalText() = default;
  TerminalText(const char* bytes) : TerminalText(std::string_view(bytes)) {}
  TerminalText(const std::string& bytes) : TerminalText(std::string_view(bytes)) {}
  TerminalText(std::string_view bytes);

  TerminalText& operator+=(const TerminalText& more);
  // Ends the line.
  TerminalText& EndLine();
  // What erases the line that the cursor is in, and takes the cursor to its beginning.
  static TerminalText EraseLine();

  // The bytes to send.
  [[nodiscard]] const std::string& Text() const& { return text_; }
  [[nodiscard]] std::string Text() && { return std::move(text_); }

  friend TerminalText operator+(TerminalText text, const TerminalText& more) {
    return text += more;
  }
  friend bool operator==(const TerminalText& text, std::string_view bytes) {
    return std::string_view(text.text_) == bytes;
  }
  // Sends it as it is, to a terminal too.
  friend std::ostream& operator<<(std::ostream& out, const TerminalText& text) {
    text.Send(out);
    return out;
  }

 private:
  friend class Painter;

  void Send(std::ostream& out) const;

  std::string text_;
};

// Colours texts, or leaves them as they are.
class Painter {
 public:
  explicit Painter(bool isColoured) : isColoured_(isColoured) {}

  [[nodiscard]] TerminalText Paint(Colour colour, TerminalText text) const;

 private:
  bool isColoured_;
};

// As long as it lives, whatever is written to std::cout and std::cerr is escaped where these are
// terminals: all but line ends, and what was escaped by type already. Where they are pipes or
// files, which programs read, every byte stays as it is. One at a time.
class TerminalOutput {
 public:
  TerminalOutput();
  // The same for streams that are terminals or not as said.
  TerminalOutput(bool isOutTerminal, bool isErrTerminal);
  ~TerminalOutput();
  TerminalOutput(const TerminalOutput&) = delete;
  TerminalOutput& operator=(const TerminalOutput&) = delete;

 private:
  class EscapingBuffer;
  friend class TerminalText;
  friend void PrintLine(std::ostream& out, const std::string& line);

  std::unique_ptr<EscapingBuffer> out_;
  std::unique_ptr<EscapingBuffer> err_;
};

// Prints `line` and ends it, in one piece: on a terminal with line ends that it holds escaped too,
// so that a name cannot pass for a line of its own.
void PrintLine(std::ostream& out, const std::string& line);

}  // namespace SecPolicyTool
