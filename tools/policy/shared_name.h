// The name of a file that many places are in.
#pragma once

#include <compare>
#include <concepts>
#include <memory>
#include <string>
#include <string_view>

namespace SecPolicyTool {

// Copies share the text: a policy has a place for each of its rules, and few files.
class SharedName {
 public:
  SharedName() = default;  // no name; takes no memory
  // NOLINTBEGIN(google-explicit-constructor): the same, otherwise written
  template <std::convertible_to<std::string_view> Name>
  SharedName(const Name& name) : SharedName(std::string_view(name)) {}
  SharedName(std::string_view name)
      : text_(name.empty() ? nullptr : std::make_shared<const std::string>(name)) {}
  operator const std::string&() const { return Text(); }
  // NOLINTEND(google-explicit-constructor)

  [[nodiscard]] const std::string& Text() const {
    static const std::string kNone;
    return text_ ? *text_ : kNone;
  }
  [[nodiscard]] bool empty() const { return text_ == nullptr; }

  friend bool operator==(const SharedName& a, const SharedName& b) {
    return a.text_ == b.text_ || a.Text() == b.Text();
  }
  friend std::strong_ordering operator<=>(const SharedName& a, const SharedName& b) {
    return a.Text() <=> b.Text();
  }
  template <std::convertible_to<std::string_view> Name>
  friend bool operator==(const SharedName& a, const Name& b) {
    return a.Text() == std::string_view(b);
  }

 private:
  std::shared_ptr<const std::string> text_;
};

}  // namespace SecPolicyTool
