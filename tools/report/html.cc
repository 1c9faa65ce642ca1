#include "tools/report/html.h"

#include <utility>

#include "host/text/escaped.h"

namespace SecPolicyTool {

namespace {

std::string EscapedMarkup(const std::string& text) {
  std::string escaped;
  for (const char c : StandIn::Escaped(text).Text()) {
    switch (c) {
      case '&':
        escaped += "&amp;";
        break;
      case '<':
        escaped += "&lt;";
        break;
      case '>':
        escaped += "&gt;";
        break;
      case '"':
        escaped += "&quot;";
        break;
      case '\'':
        escaped += "&#39;";
        break;
      default:
        escaped += c;
    }
  }
  return escaped;
}

std::string StartTag(const char* tag, const std::vector<Attribute>& attributes) {
  std::string start = std::string("<") + tag;
  for (const Attribute& attribute : attributes) {
    start += std::string(" ") + attribute.name + "=\"" + EscapedMarkup(attribute.value) + "\"";
  }
  return start + ">";
}

}  // namespace

Html::Html(const std::string& text) : markup_(EscapedMarkup(text)) {}

Html Html::TrustedMarkup(std::string markup) {
  Html html;
  html.markup_ = std::move(markup);
  return html;
}

Html& Html::operator+=(const Html& next) {
  markup_ += next.markup_;
  return *this;
}

Html operator+(Html first, const Html& second) { return std::move(first += second); }

// The content may be most of a page: it is put between its tags in place, and not copied.
Html Element(const char* tag, const std::vector<Attribute>& attributes, Html content) {
  content.markup_.insert(0, StartTag(tag, attributes));
  content.markup_ += std::string("</") + tag + ">";
  return content;
}

Html Element(const char* tag, Html content) { return Element(tag, {}, std::move(content)); }

Html VoidElement(const char* tag, const std::vector<Attribute>& attributes) {
  return Html::TrustedMarkup(StartTag(tag, attributes));
}

}  // namespace SecPolicyTool
