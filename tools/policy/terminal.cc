#include "tools/policy/terminal.h"

#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <iostream>
#include <streambuf>
#include <utility>

#include "host/text/escaped.h"
#include "host/text/utf8_text.h"

namespace SecPolicyTool {

using StandIn::Escaped;

namespace {

std::string_view Variable(const char* name) {
  const char* value = std::getenv(name);
  return value == nullptr ? "" : value;
}

// The bytes at the end of `bytes` that may be the beginning of a character.
std::size_t UnfinishedBytes(std::string_view bytes) {
  const std::size_t most = std::min<std::size_t>(3, bytes.size());
  for (std::size_t count = 1; count <= most; ++count) {
    const auto byte = static_cast<unsigned char>(bytes[bytes.size() - count]);
    if (byte >= 0xC0) {
      return StandIn::CharacterBytes(bytes.substr(bytes.size() - count)) == 0 ? count : 0;
    }
    if (byte < 0x80) return 0;
  }
  return 0;
}

}  // namespace

bool WantsColour(int descriptor) {
  return Variable("NO_COLOR").empty() && Variable("TERM") != "dumb" && isatty(descriptor) == 1;
}

TerminalText::TerminalText(std::string_view bytes) : text_(Escaped(bytes).Text()) {}

TerminalText& TerminalText::operator+=(const TerminalText& more) {
  text_ += more.text_;
  return *this;
}

TerminalText& TerminalText::EndLine() {
  text_ += '\n';
  return *this;
}

TerminalText TerminalText::EraseLine() {
  TerminalText text;
  text.text_ = "\r\x1b[K";
  return text;
}

TerminalText Painter::Paint(Colour colour, TerminalText text) const {
  static constexpr std::array kCodes{"31", "33", "32", "36", "1"};
  if (!isColoured_) return text;
  text.text_ = std::string("\x1b[") + kCodes.at(static_cast<std::size_t>(colour)) + "m" +
               text.text_ + "\x1b[0m";
  return text;
}

// Takes the place of a stream's buffer, and hands on to it what a terminal only shows. Keeps
// nothing back but the beginning of a character, until the rest of it or a flush comes.
class TerminalOutput::EscapingBuffer : public std::streambuf {
 public:
  explicit EscapingBuffer(std::ostream& stream) : stream_(stream), terminal_(stream.rdbuf(this)) {}
  ~EscapingBuffer() override { Leave(); }
  EscapingBuffer(const EscapingBuffer&) = delete;
  EscapingBuffer& operator=(const EscapingBuffer&) = delete;

  // The one of `stream`; nullptr when it is no terminal.
  static EscapingBuffer* Of(const std::ostream& stream) {
    return dynamic_cast<EscapingBuffer*>(stream.rdbuf());
  }

  // Sends what is escaped by type.
  bool Send(const TerminalText& text) {
    return SendEscaped(std::exchange(unfinished_, {})) && SendBytes(text.Text());
  }

  // Gives the stream back what it had.
  void Leave() {
    if (stream_.rdbuf() == this) stream_.rdbuf(terminal_);
  }

 protected:
  std::streamsize xsputn(const char* bytes, std::streamsize count) override {
    std::string all = std::exchange(unfinished_, {});
    all.append(bytes, static_cast<std::size_t>(count));
    const std::size_t whole = all.size() - UnfinishedBytes(all);
    unfinished_ = all.substr(whole);
    return SendEscaped(std::string_view(all).substr(0, whole)) ? count : 0;
  }

  int_type overflow(int_type byte) override {
    if (traits_type::eq_int_type(byte, traits_type::eof())) return traits_type::not_eof(byte);
    const char c = traits_type::to_char_type(byte);
    return xsputn(&c, 1) == 1 ? byte : traits_type::eof();
  }

  int sync() override {
    return SendEscaped(std::exchange(unfinished_, {})) ? terminal_->pubsync() : -1;
  }

 private:
  bool SendBytes(std::string_view bytes) {
    const auto count = static_cast<std::streamsize>(bytes.size());
    return terminal_->sputn(bytes.data(), count) == count;
  }

  bool SendEscaped(std::string_view bytes) {
    TerminalText text;
    for (std::size_t end; (end = bytes.find('\n')) != std::string_view::npos;) {
      (text += bytes.substr(0, end)).EndLine();
      bytes.remove_prefix(end + 1);
    }
    return SendBytes((text += bytes).Text());
  }

  std::ostream& stream_;
  std::streambuf* terminal_;
  std::string unfinished_;
};

TerminalOutput::TerminalOutput()
    : TerminalOutput(isatty(STDOUT_FILENO) == 1, isatty(STDERR_FILENO) == 1) {}

TerminalOutput::TerminalOutput(bool isOutTerminal, bool isErrTerminal)
    : out_(isOutTerminal ? std::make_unique<EscapingBuffer>(std::cout) : nullptr),
      err_(isErrTerminal ? std::make_unique<EscapingBuffer>(std::cerr) : nullptr) {}

TerminalOutput::~TerminalOutput() = default;

void TerminalText::Send(std::ostream& out) const {
  auto* terminal = TerminalOutput::EscapingBuffer::Of(out);
  if (terminal == nullptr) {
    out << text_;
    return;
  }
  const std::ostream::sentry isReady(out);
  if (isReady && !terminal->Send(*this)) out.setstate(std::ios::badbit);
}

void PrintLine(std::ostream& out, const std::string& line) {
  if (TerminalOutput::EscapingBuffer::Of(out) == nullptr) {
    out << line + "\n";
  } else {
    out << TerminalText(line).EndLine();
  }
}

}  // namespace SecPolicyTool
