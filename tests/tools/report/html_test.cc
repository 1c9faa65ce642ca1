// HTML that text cannot break out of.
#include "tools/report/html.h"

#include <gtest/gtest.h>

namespace SecPolicyTool {
namespace {

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
