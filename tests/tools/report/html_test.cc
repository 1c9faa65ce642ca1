// HTML that text cannot break out of.
#include "tools/report/html.h"

#include <gtest/gtest.h>

#include "tools/report/visible_text.h"

namespace SecPolicyTool {
namespace {

TEST(VisibleTextTest, Table) {
  struct Case {
    std::string text;
    std::string visible;
  };
  for (const Case& row : {
           Case{"", ""},
           Case{"plain /etc/hosts", "plain /etc/hosts"},
           Case{std::string("a\0b", 3), R"(a\x00b)"},
           Case{"a\tb\r\n\x1b[2J\x7f", R"(a\x09b\x0d\x0a\x1b[2J\x7f)"},
           Case{"grün, 域, 🙂", "grün, 域, 🙂"},
           // What has no shape, or turns the direction of writing.
           Case{std::string("a\xe2\x80") + "\xae.", R"(a\xe2\x80\xae.)"},
           Case{"a\u200bb\ufeff", R"(a\xe2\x80\x8bb\xef\xbb\xbf)"},
           Case{"a\u0085", R"(a\xc2\x85)"},
           // What is no UTF-8: lone bytes, cut short, overlong, surrogates, beyond the last.
           Case{"a\xff\x80z", R"(a\xff\x80z)"},
           Case{"\xe5\x9f", R"(\xe5\x9f)"},
           Case{"\xe5\x9fz", R"(\xe5\x9fz)"},
           Case{"\xc0\xbc", R"(\xc0\xbc)"},
           Case{"\xe0\x80\xbc", R"(\xe0\x80\xbc)"},
           Case{"\xed\xa0\x80", R"(\xed\xa0\x80)"},
           Case{"\xf4\x90\x80\x80", R"(\xf4\x90\x80\x80)"},
           Case{"\xf8\x88\x80\x80\x80", R"(\xf8\x88\x80\x80\x80)"},
       }) {
    EXPECT_EQ(VisibleText(row.text), row.visible);
  }
}

TEST(VisibleTextTest, ShortenedBetweenCharacters) {
  EXPECT_EQ(CharactersIn("grün"), 4U);
  EXPECT_EQ(Shortened("grün", 4), "grün");
  EXPECT_EQ(Shortened("grüne", 3), "grü…");
  EXPECT_EQ(Shortened("域域域", 1), "域…");
}

TEST(HtmlTest, TextIsEscaped) {
  EXPECT_EQ(Html("<b title=\"x\" id='y'>&amp;").Markup(),
            "&lt;b title=&quot;x&quot; id=&#39;y&#39;&gt;&amp;amp;");
  EXPECT_EQ(Html(std::string("a\0<", 3)).Markup(), R"(a\x00&lt;)");
}

TEST(HtmlTest, AttributesAreEscaped) {
  EXPECT_EQ(Element("a", {{"title", "\"><script>"}, {"id", "x"}}, "y").Markup(),
            "<a title=\"&quot;&gt;&lt;script&gt;\" id=\"x\">y</a>");
  EXPECT_EQ(VoidElement("input", {{"value", "'&"}}).Markup(), "<input value=\"&#39;&amp;\">");
}

TEST(HtmlTest, PiecesArePutTogetherAsTheyAre) {
  Html list = Element("li", "<1>");
  list += Element("li", "2") + " and " + Html::TrustedMarkup("<hr>");
  EXPECT_EQ(Element("ul", list).Markup(), "<ul><li>&lt;1&gt;</li><li>2</li> and <hr></ul>");
  EXPECT_TRUE(Html().IsEmpty());
  EXPECT_FALSE(list.IsEmpty());
}

}  // namespace
}  // namespace SecPolicyTool
