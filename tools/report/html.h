// HTML that text cannot break out of.
#pragma once

#include <string>
#include <vector>

namespace SecPolicyTool {

struct Attribute {
  const char* name;
  std::string value;
};

// A piece of a page. Strings become text of it, whatever bytes they hold, so that nobody has to
// remember to escape them; tags come from Element and VoidElement alone.
class Html {
 public:
  Html() = default;
  Html(const std::string& text);  // what a page cannot show is written as by StandIn::Escaped
  Html(const char* text) : Html(std::string(text)) {}

  // Markup, which is taken as it is: the one way around escaping. Never for what a policy says.
  static Html TrustedMarkup(std::string markup);

  Html& operator+=(const Html& next);
  [[nodiscard]] bool IsEmpty() const { return markup_.empty(); }
  [[nodiscard]] const std::string& Markup() const { return markup_; }

 private:
  friend Html Element(const char* tag, const std::vector<Attribute>& attributes, Html content);

  std::string markup_;
};

Html operator+(Html first, const Html& second);

// An element with its content.
Html Element(const char* tag, const std::vector<Attribute>& attributes, Html content);
Html Element(const char* tag, Html content);
// An element that has no content and no end.
Html VoidElement(const char* tag, const std::vector<Attribute>& attributes);

}  // namespace SecPolicyTool
