// The control library's exception and the structured message it may carry.
#pragma once

#include <exception>
#include <memory>
#include <string>
#include <utility>

namespace Tavon::Lib {

// A message in the structured form of the host's event system: a handle that is cheap to copy.
// Copies share one content, which lives as long as the last of them; the count of sharers is
// kept atomically. The content's own layout belongs to the event system and is not looked at.
class [[gnu::visibility("default")]] KestMessage {
 public:
  // An empty message: shares nothing.
  KestMessage() noexcept = default;

  // A message with this content; a null pointer makes an empty message.
  explicit KestMessage(std::shared_ptr<const void> content) noexcept
      : content_(std::move(content)) {}

  // True for a message without content.
  [[nodiscard]] bool Empty() const noexcept { return content_ == nullptr; }

  // How many handles share the content; 0 for an empty message.
  [[nodiscard]] long ShareCount() const noexcept { return content_.use_count(); }

 private:
  std::shared_ptr<const void> content_;
};

// The one exception type of the library and of the platform's libraries. `what()` is the complete
// text for a person; nothing needs to be added to it.
class [[gnu::visibility("default")]] TavonException : public std::exception {
 public:
  // Keeps a copy of the text; the structured message is empty.
  explicit TavonException(const std::string& message) : message_(message) {}
  // The same for a NUL-terminated text, which must not be a null pointer.
  explicit TavonException(const char* message) : message_(message) {}

  // Copies the text; the structured message is shared.
  TavonException(const TavonException&) = default;
  TavonException(TavonException &&) = default;  // takes text and message over
  // Copies the text; the structured message is shared.
  TavonException& operator=(const TavonException&) = default;
  TavonException& operator=(TavonException&&) = default;  // takes text and message over
  ~TavonException() override = default;

  // Valid as long as this exception lives.
  [[nodiscard]] const char* what() const noexcept override { return message_.c_str(); }

  // The structured form; empty unless a constructor was given one.
  [[nodiscard]] const KestMessage& StructuredMessage() const noexcept { return structuredMessage_; }

 protected:
  // Keeps a copy of the text, and shares the structured message.
  TavonException(const std::string& message, const KestMessage& structuredMessage)
      : message_(message), structuredMessage_(structuredMessage) {}

 private:
  std::string message_;
  KestMessage structuredMessage_;
};

}  // namespace Tavon::Lib
